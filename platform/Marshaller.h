// Marshaller: the remote-call layer's marshalling state that travels with
// each observer event. This system only makes and copies one; it never reads
// or writes it, so the stand-in holds nothing. Marshalling itself does not
// belong here.
#pragma once

#include "Export.h"

class LS_EXPORT Marshaller {
 public:
  Marshaller() = default;
  Marshaller(Marshaller const&) = default;
  Marshaller& operator=(Marshaller const&) = default;
};

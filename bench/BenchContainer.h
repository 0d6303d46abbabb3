// BenchContainer: the plainest concrete container, for benchmarks that
// measure the element layer itself rather than a face.
#pragma once

#include "LS_CContainer.h"
#include "LS_ElementClassTable.h"

class BenchContainer : public LS_CContainer {
 public:
  XCode create(RefPtr<LS_IElement>& element) override { return LS_makeElement<BenchContainer>(element); }
};

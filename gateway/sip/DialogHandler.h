// DialogHandler: a part that keeps dialogs of its own (the calls), asked by
// the front-end about every ACK and every request with a To tag before
// Admission would answer it 481 as belonging to no dialog.
//
// A part that runs libre's session layer leaves the requests of its
// sessions to that layer's listener, which the stack asks after the
// front-end's: PASSED tells the front-end to decline the request so that
// the next listener takes it. Outlives the front-end it is set on.
#pragma once

#include "sip/Libre.h"

class DialogHandler {
 public:
  enum class Verdict {
    ANSWERED,  // taken care of here
    PASSED,    // for the next listener on the stack
    UNKNOWN,   // no dialog of this part: the front-end answers as usual
  };

  virtual Verdict inDialog(sip_msg const& request) = 0;

 protected:
  ~DialogHandler() = default;
};

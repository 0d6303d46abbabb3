#include "sip/AnswerCounters.h"

namespace {

char const* const kMethods[] = {"REGISTER", "INVITE",  "ACK",  "CANCEL", "BYE",     "MESSAGE", "SUBSCRIBE",
                                "NOTIFY",   "OPTIONS", "INFO", "UPDATE", "PUBLISH", "REFER",   "PRACK"};

}  // namespace

void AnswerCounters::count(pl const& method, uint16_t code) {
  char const* name = "other";
  for (char const* known : kMethods)
    if (pl_strcmp(&method, known) == 0) {
      name = known;
      break;
    }
  ++m_counts[{name, code}];
}

// MethodTable: which RequestHandler answers a request, by its method. The
// method is matched case-sensitively, as RFC 3261 section 7.1 has it
// ("INVITE" is not "invite"); a method without a handler is no business of
// the table's (the front-end answers it 405).
//
// Decision: a list searched in order rather than a map. A gateway registers
// a handful of methods, and a request's method is a pl into its buffer: the
// search compares it in place, where a map would first copy it into a
// string for every request.
//
// Filled before the stack takes requests and read only afterwards; borrows
// its handlers (see RequestHandler). libre's thread only.
#pragma once

#include <string>
#include <vector>

#include "sip/Libre.h"
#include "sip/RequestHandler.h"

class MethodTable {
 public:
  // handler answers method from now on, in place of any handler before it.
  void add(std::string method, RequestHandler& handler);
  // Null when no handler answers method.
  RequestHandler* find(pl const& method) const;

 private:
  struct Entry {
    std::string method;
    RequestHandler* handler;
  };

  std::vector<Entry> m_entries;
};

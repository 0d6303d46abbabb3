#include "sip/MethodTable.h"

#include <utility>

void MethodTable::add(std::string method, RequestHandler& handler) {
  for (Entry& entry : m_entries) {
    if (entry.method == method) {
      entry.handler = &handler;
      return;
    }
  }
  m_entries.push_back(Entry{std::move(method), &handler});
}

RequestHandler* MethodTable::find(pl const& method) const {
  for (Entry const& entry : m_entries) {
    if (pl_strcmp(&method, entry.method.c_str()) == 0)
      return entry.handler;
  }
  return nullptr;
}

// The method-identifier tables that name an interface's operations across
// the platform's remote-call layer. Each interface's MID holder keeps one
// static table of (identifier, name) rows; identifiers without a row (the
// gaps inside a group of hundreds) have no name.
#pragma once

#include "Export.h"

#include <cstddef>

struct LS_EXPORT LS_MethodName {
  unsigned int id;
  char const* name;
};

// The name of id in table, or null when the table has no such row.
LS_EXPORT char const* LS_findMethodName(LS_MethodName const* table, size_t rows, unsigned int id);

template <size_t Rows>
char const* LS_findMethodName(LS_MethodName const (&table)[Rows], unsigned int id) {
  return LS_findMethodName(table, Rows, id);
}

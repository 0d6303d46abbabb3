#include "LS_MethodTable.h"

char const* LS_findMethodName(LS_MethodName const* table, size_t rows, unsigned int id) {
  for (size_t i = 0; i < rows; ++i) {
    if (table[i].id == id)
      return table[i].name;
  }
  return nullptr;
}

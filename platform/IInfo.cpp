#include "IInfo.h"

UUID const& IInfo::IID() {
  static UUID const id("d767613a-fdf8-408f-b401-ccaa3dad9048", "IInfo");
  return id;
}

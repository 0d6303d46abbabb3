#include "IDriverRepository.h"

UUID const& IDriverRepository::IID() {
  static UUID const id("4db8d857-27e1-4e94-99e1-29e2dc9fadf9", "IDriverRepository");
  return id;
}

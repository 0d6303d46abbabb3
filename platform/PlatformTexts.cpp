#include "PlatformTexts.h"

namespace ERROR {
char const INVALID[] = "<invalid>";
}  // namespace ERROR

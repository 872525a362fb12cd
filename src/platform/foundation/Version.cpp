#include "platform/foundation/Version.h"

namespace nimbo {

const char* const kVersion = NIMBO_VERSION;

}  // namespace nimbo

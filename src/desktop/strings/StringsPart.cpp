#include "desktop/strings/StringsPart.h"

#include "desktop/system/LatePart.h"

namespace nimbo {

StringsPart& stringsPart() { return latePart<StringsPart>("libnimbo-strings.so", "nimbo_strings"); }

}  // namespace nimbo

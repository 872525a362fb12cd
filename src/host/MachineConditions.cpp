#include "host/MachineConditions.h"

#include "desktop/system/LatePart.h"
#include "platform/foundation/Log.h"

namespace nimbo {

bool MachineConditions::areScarce() {
  try {
    if (!_reported)
      _reported = latePart<ConditionsPart>("libnimbo-conditions.so", "nimbo_conditions").listen(_networkReturned);
    return _reported->areScarce();
  } catch (const LatePartMissing& missing) {
    writeLog({kDefaultLogSubsystem, "MachineConditions"}, LogLevel::error, "%@", {missing.what()});
    return false;
  }
}

}  // namespace nimbo

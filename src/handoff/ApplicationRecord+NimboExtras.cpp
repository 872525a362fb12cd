#include "handoff/ApplicationRecord+NimboExtras.h"
#include "platform/Platform.h"

namespace nimbo {

ApplicationRecordRef _nimbo_containingApplicationProxy(ErrorRef* error) {
  const BundleRecordRef record = Platform::current().activityLauncher().bundleRecordOfCurrentProcess();
  if (!record) {
    if (error)
      *error = Error::errorWithDomain_code_userInfo(
          std::string(kNimboActivityErrorDomain), 0,
          {{std::string(kErrorDebugDescriptionKey), box("no appliction proxy object for current process")}});
    return nullptr;
  }
  if (const auto extension = std::dynamic_pointer_cast<const ExtensionRecord>(record))
    return std::dynamic_pointer_cast<const ApplicationRecord>(extension->containingBundle());
  return std::dynamic_pointer_cast<const ApplicationRecord>(record);
}

}  // namespace nimbo

#include "host/window/ErrorTexts.h"

#include "desktop/gtfs/TransitLineServiceError.h"
#include "desktop/store/FavoritesEditor.h"
#include "desktop/store/StateDatabaseFile.h"
#include "desktop/system/AtomicFile.h"
#include "platform/Localization.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

const char* keyOfCode(TransitLineServiceError code) {
  switch (code) {
    using enum TransitLineServiceError;
    case configuration:
      return "Window_Error_Configuration";
    case badFeedName:
      return "Window_Error_FeedName";
    case feedNameTaken:
      return "Window_Error_FeedNameTaken";
    case unknownFeed:
      return "Window_Error_UnknownFeed";
    case badAddress:
      return "Window_Error_Address";
    case unreadableFile:
      return "Window_Error_Unreadable";
    case badStaticFeed:
      return "Window_Error_StaticFeed";
    case badAlerts:
      return "Window_Error_Alerts";
    case staleAlerts:
      return "Window_Error_StaleAlerts";
    case unreachable:
      return "Window_Error_Unreachable";
    case timedOut:
      return "Window_Error_TimedOut";
    case serverFailure:
      return "Window_Error_Server";
    case keyNeeded:
      return "Window_Error_KeyNeeded";
    case untrustedServer:
      return "Window_Error_Untrusted";
    case tooLarge:
      return "Window_Error_TooLarge";
    case notKept:
      return "Window_Error_NotKept";
    case unknownLine:
    case internal:
      break;
  }
  return nullptr;
}

const char* keyOfCode(FavoritesError code) {
  return code == FavoritesError::lost ? "Window_Error_FavoritesLost" : "Window_Error_FavoritesChanged";
}

const char* keyOfCode(StateDatabaseError code) {
  switch (code) {
    using enum StateDatabaseError;
    case cannotRead:
      return "Window_Error_Unreadable";
    case cannotWrite:
      return "Window_Error_Unwritable";
    case newerVersion:
      return "Window_Error_NewerState";
    case foreign:
      return "Window_Error_ForeignState";
    case setAside:
      return "Window_Error_StateSetAside";
  }
  return nullptr;
}

/// Null for an error that the window has no words for.
const char* keyOfError(const Error& error) {
  if (error.domain() == kTransitLineServiceErrorDomain)
    return keyOfCode(static_cast<TransitLineServiceError>(error.code()));
  if (error.domain() == kFavoritesErrorDomain) return keyOfCode(static_cast<FavoritesError>(error.code()));
  if (error.domain() == kStateDatabaseErrorDomain) return keyOfCode(static_cast<StateDatabaseError>(error.code()));
  return error.domain() == kFileErrorDomain ? "Window_Error_Unwritable" : nullptr;
}

}  // namespace

std::string textOfError(const Error& error) {
  writeLog({kDefaultLogSubsystem, "Window"}, LogLevel::info, "%{private}@", {error.reason()});
  const char* key = keyOfError(error);
  return LocalizedFormat(LocalizedString(key ? key : "TransitWidgetLoadingError_Unknown"), {error.subject()});
}

}  // namespace nimbo

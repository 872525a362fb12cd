#include "host/window/Texts.h"

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/store/FavoritesEditor.h"
#include "desktop/store/StateDatabaseFile.h"
#include "desktop/system/AtomicFile.h"
#include "host/FeedAnswers.h"
#include "host/notices/NoticeError.h"
#include "platform/Localization.h"
#include "platform/foundation/Log.h"
#include "platform/transit/IncidentStringProvider.h"

namespace nimbo {

namespace {

/// Whether a text says what an excerpt says. Excerpts are on one line, with a colon after what was a heading.
bool says(const std::string& text, const std::string& excerpt) {
  const auto words = [](std::string all) {
    std::erase_if(all, [](char c) { return c == ' ' || c == '\n' || c == ':'; });
    return all;
  };
  return words(text).find(words(excerpt)) != std::string::npos;
}

}  // namespace

std::string nameOfLine(const TransitLine& line) {
  const TransitArtworkRef& artwork = line.artwork();
  if (artwork && artwork->accessibilityText() && !artwork->accessibilityText()->empty())
    return *artwork->accessibilityText();
  return line.name() && !line.name()->empty() ? *line.name() : std::to_string(line.muid());
}

std::string nameBesideShield(const TransitLine& line) {
  const std::string name = nameOfLine(line);
  const TransitArtworkRef& artwork = line.artwork();
  if (!artwork || !artwork->shieldDataSource()) return name;
  const std::string shortName = artwork->shieldDataSource()->shieldText.value_or("") + ", ";
  return name.starts_with(shortName) ? name.substr(shortName.size()) : name;
}

std::string systemNameOfLine(const TransitLine& line) {
  return line.system() ? line.system()->name().value_or("") : std::string();
}

std::vector<std::string> textsBelowTitle(const TransitIncident& incident) {
  const std::string title = IncidentStringProvider::cellTitleForIncident(&incident);
  const std::string summary = incident.summary().value_or(""), description = incident.fullDescription().value_or("");
  std::vector<std::string> texts;
  if (!summary.empty() && summary != title && !says(description, summary)) texts.push_back(summary);
  if (!description.empty() && description != title) texts.push_back(description);
  return texts;
}

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
    case otherFeed:
      return "Window_Error_OtherFeed";
    case foreignAlerts:
      return "Window_Error_ForeignAlerts";
    case downloading:
      return "Window_Error_Downloading";
    case notFound:
      return "Window_Error_NotFound";
    case cutOff:
      return "Window_Error_CutOff";
    case tripsMissing:
      return "Window_Error_TripsMissing";
    case badCatalog:
      return "Window_Error_Catalog";
    case wantedKey:
      return "Window_Error_WantedKey";
    case badKey:
      return "Window_Error_BadKey";
    case staticForAlerts:
    case alertsForStatic:
      return "Window_Error_Swapped";
    case webPage:
      return "Window_Error_WebPage";
    case unknownLine:
      return "Window_Error_LineGone";
    case notAsked:
      return "Window_Error_NotAsked";
    case unknownCatalogFeed:
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
  if (error.domain() == kNoticeErrorDomain) return "Window_Error_Notices";
  return error.domain() == kFileErrorDomain ? "Window_Error_Unwritable" : nullptr;
}

}  // namespace

std::string textOfReceived(std::uint64_t received, std::optional<std::uint64_t> length) {
  constexpr std::uint64_t kMiB = 1 << 20;
  if (received < kMiB) return {};
  if (!length) return LocalizedFormat(LocalizedString("Window_Received"), {received / kMiB});
  return LocalizedFormat(LocalizedString("Window_ReceivedOf"), {received / kMiB, (*length + kMiB - 1) / kMiB});
}

std::string detailOfError(const Error& error) { return keyOfError(error) ? std::string() : error.reason(); }

std::string textOfError(const Error& error) {
  writeLog({kDefaultLogSubsystem, "Window"}, LogLevel::info, "%{private}@", {error.reason()});
  const char* key = keyOfError(error);
  return LocalizedFormat(LocalizedString(key ? key : "TransitWidgetLoadingError_Unknown"), {error.subject()});
}

std::string textOfState(const protocol::LineReport& line) {
  switch (line.state) {
    case protocol::LineState::good:
      return LocalizedString("TransitWidget_GoodService_Title");
    case protocol::LineState::affected:
      return LocalizedFormat(LocalizedString("Window_Line_Affected"), {std::uint64_t{line.incidents.size()}});
    case protocol::LineState::unknown:
      break;
  }
  const std::string reason =
      line.reason ? textOfError(*errorOf(*line.reason)) : LocalizedString("TransitWidgetLoadingError_Unknown");
  return LocalizedFormat(LocalizedString("Window_Line_Unknown"), {reason});
}

}  // namespace nimbo

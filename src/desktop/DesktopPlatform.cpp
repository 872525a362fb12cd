#include "desktop/DesktopPlatform.h"

#include <algorithm>
#include <cstdlib>
#include <sstream>

#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/feeds/SampleCity.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"

namespace nimbo {

namespace {

constexpr LogFacility kLog{kDefaultLogSubsystem, "DesktopPlatform"};

std::unique_ptr<SystemLog> makeLogInto(std::unique_ptr<LogSink> sink) {
  const LogOptions options = LogOptions::fromEnvironment();
  return sink ? std::make_unique<SystemLog>(options, std::move(sink)) : makeLog(options);
}

/// Tells of a database that was set aside. May come from any thread.
void logNotice(const ErrorRef& notice) { writeLog(kLog, LogLevel::error, "%@", {notice->reason()}); }

/// The favourites of a rider who set nothing up: the sample city's. One who set a feed up chooses his own.
std::vector<TransitLineRef> firstFavorites(const std::filesystem::path& configFolder) {
  const auto feeds = FeedConfiguration(configFolder).feeds();
  return feeds && feeds->empty() ? SampleCity::favorites() : std::vector<TransitLineRef>();
}

/// The locale without a language.
constexpr const char* kPlainLocale = "C";

/// "de_AT.UTF-8@euro" as "de_AT", "POSIX" as "C".
std::string plainNameOfLocale(std::string_view locale) {
  const std::string name(locale.substr(0, locale.find_first_of(".@")));
  return name == "POSIX" ? kPlainLocale : name;
}

/// "de_AT" as "de-AT".
std::string tagOfLocale(std::string locale) {
  std::replace(locale.begin(), locale.end(), '_', '-');
  return locale;
}

class NoTransitLines final : public TransitLineService {
  void lookup(const std::vector<MapItemIdentifierRef>&, Handler handler) override {
    Platform::current().mainRunLoop().dispatchAsync([handler = std::move(handler)] {
      handler({}, transitLineServiceError(TransitLineServiceError::internal, "This program looks no lines up."));
    });
  }
};

std::unique_ptr<TransitLineService> orNone(std::unique_ptr<TransitLineService> lines) {
  return lines ? std::move(lines) : std::make_unique<NoTransitLines>();
}

}  // namespace

std::string DesktopPlatform::localeOfEnvironment() {
  std::string locale = kPlainLocale;
  for (const char* variable : {"LC_ALL", "LC_MESSAGES", "LANG"})
    if (const char* value = std::getenv(variable); value && *value) {
      locale = plainNameOfLocale(value);
      break;
    }
  const char* languages = std::getenv("LANGUAGE");
  if (!languages || locale == kPlainLocale) return locale == kPlainLocale ? "en" : locale;
  std::optional<std::string> first;
  std::istringstream list{std::string(languages)};
  for (std::string language; std::getline(list, language, ':');) {
    if (language.empty()) continue;
    if (language = plainNameOfLocale(language); language == kPlainLocale) language = "en";
    if (ICUStringTables::speak(language)) return language;
    if (!first) first = language;
  }
  return first.value_or(locale);
}

DesktopPlatform::DesktopPlatform(Options options)
    : _paths(std::move(options.paths)),
      _locale(options.locale.empty() ? localeOfEnvironment() : std::move(options.locale)),
      _clock(options.virtualTime ? static_cast<Clock&>(*options.virtualTime) : _systemClock),
      _log(makeLogInto(std::move(options.logSink))),
      _strings(_locale),
      _database(std::make_shared<StateDatabase>(_paths.state, _clock, options.notice ? options.notice : &logNotice)),
      _sharedSettings(_database),
      _analytics(_database),
      _transitLines(orNone(std::move(options.transitLines))),
      _favoritesEditor(_database, [folder = _paths.config] { return firstFavorites(folder); }),
      _favorites(_favoritesEditor, *_transitLines),
      _memoryPressure(options.runLoop),
      _drawing(std::make_shared<LateDrawing>(languageTag())),
      _platform(std::make_unique<Platform>(PlatformServices{.clock = _clock,
                                                            .mainRunLoop = options.runLoop,
                                                            .log = *_log,
                                                            .signposts = *_log,
                                                            .random = _random,
                                                            .strings = _strings,
                                                            .sharedSettings = _sharedSettings,
                                                            .favorites = _favorites,
                                                            .transitLines = _favorites,
                                                            .network = _network,
                                                            .memoryPressure = _memoryPressure,
                                                            .activityLauncher = options.activityLauncher,
                                                            .analytics = _analytics,
                                                            .deviceLockState = _deviceLockState,
                                                            .archive = _archive,
                                                            .compressor = _compressor,
                                                            .images = *_drawing,
                                                            .text = *_drawing,
                                                            .shieldRenderer = _drawing})) {}

DesktopPlatform::~DesktopPlatform() = default;

std::string DesktopPlatform::languageTag() const { return tagOfLocale(_locale); }

}  // namespace nimbo

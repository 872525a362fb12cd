#pragma once

#include <filesystem>
#include <memory>
#include <string>

#include "desktop/archive/Bzip2.h"
#include "desktop/archive/CBORKeyedArchive.h"
#include "desktop/drawing/LateDrawing.h"
#include "desktop/store/FavoritesEditor.h"
#include "desktop/store/GuardedFavorites.h"
#include "desktop/store/SQLiteAnalyticsPipeline.h"
#include "desktop/store/SQLiteSharedSettings.h"
#include "desktop/store/StateDatabase.h"
#include "desktop/strings/ICUStringTables.h"
#include "desktop/system/GLibRunLoop.h"
#include "desktop/system/LinuxMemoryPressure.h"
#include "desktop/system/LinuxNetworkFailureDiagnosis.h"
#include "desktop/system/Paths.h"
#include "desktop/system/SoftLinkedDeviceLockState.h"
#include "desktop/system/SystemClock.h"
#include "desktop/system/SystemLog.h"
#include "platform/Platform.h"
#include "platform/TransitLineService.h"
#include "platform/VirtualTime.h"

namespace nimbo {

/// The platform on Linux, in force while this lives: one real part behind each interface. The parts open what they
/// need with their first use. Main thread.
class DesktopPlatform {
 public:
  struct Options {
    Paths paths;
    /// BCP 47 tag or POSIX name; empty: the environment's.
    std::string locale;
    GLibRunLoop& runLoop;
    /// Answers for lines; null in a program that looks none up, where lookups end in an error.
    std::unique_ptr<TransitLineService> transitLines;
    /// The clock in place of the machine's, or null.
    VirtualTime* virtualTime = nullptr;
    ActivityLauncher& activityLauncher;
    /// Where log lines go; null: to the journal or standard error.
    std::unique_ptr<LogSink> logSink;
    /// Told, on any thread, what the user must hear: a damaged state database was set aside. Null: it is logged.
    StateDatabase::Notice notice;
  };

  explicit DesktopPlatform(Options options);
  ~DesktopPlatform();

  FavoritesEditor& favoritesEditor() { return _favoritesEditor; }
  SQLiteAnalyticsPipeline& analytics() { return _analytics; }
  /// BCP 47.
  std::string languageTag() const;
  SQLiteSharedSettings& sharedSettings() { return _sharedSettings; }
  const std::shared_ptr<StateDatabase>& database() const { return _database; }

  /// The first language of LANGUAGE ("de_AT:fr") that has texts here, else its first; without it the locale of LC_ALL,
  /// LC_MESSAGES or LANG, in this order. "en" where none of these is set or it is "C" or "POSIX", whatever LANGUAGE
  /// says. Source: the manual of GNU gettext, "The LANGUAGE variable".
  static std::string localeOfEnvironment();

 private:
  Paths _paths;
  std::string _locale;
  SystemClock _systemClock;
  Clock& _clock;
  std::unique_ptr<SystemLog> _log;
  SystemRandom _random;
  ICUStringTables _strings;
  std::shared_ptr<StateDatabase> _database;
  SQLiteSharedSettings _sharedSettings;
  SQLiteAnalyticsPipeline _analytics;
  std::unique_ptr<TransitLineService> _transitLines;
  FavoritesEditor _favoritesEditor;
  GuardedFavorites _favorites;
  LinuxNetworkFailureDiagnosis _network;
  LinuxMemoryPressure _memoryPressure;
  SoftLinkedDeviceLockState _deviceLockState;
  CBORKeyedArchive _archive;
  Bzip2Compressor _compressor;
  std::shared_ptr<LateDrawing> _drawing;
  std::unique_ptr<Platform> _platform;
};

}  // namespace nimbo

#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <unordered_map>

#include "platform/AnalyticsPipeline.h"
#include "platform/FavoritesStore.h"
#include "platform/Localization.h"
#include "platform/MemoryPressure.h"
#include "platform/RunLoop.h"
#include "platform/SharedSettingsStore.h"
#include "platform/SystemServices.h"
#include "platform/TransitLineService.h"
#include "platform/UserActivity.h"
#include "platform/archive/KeyedArchive.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/artwork/ArtworkImageSource.h"
#include "platform/foundation/Log.h"
#include "platform/ui/TextSystem.h"

namespace nimbo {

/// The services of the machine, as the widget uses them. Whoever makes a Platform owns the services and keeps them
/// alive as long as it.
struct PlatformServices {
  Clock& clock;
  RunLoop& mainRunLoop;
  Log& log;
  Signposts& signposts;
  RandomSource& random;
  StringTables& strings;
  SharedSettings& sharedSettings;
  FavoritesPersisters& favorites;
  TransitLineService& transitLines;
  NetworkFailureDiagnosis& network;
  MemoryPressure& memoryPressure;
  ActivityLauncher& activityLauncher;
  AnalyticsPipeline& analytics;
  DeviceLockState& deviceLockState;
  KeyedArchive& archive;
  Compressor& compressor;
  ImageResources& images;
  TextSystem& text;
  std::shared_ptr<ShieldIconRenderer> shieldRenderer;  ///< null: shields are not drawn
};

/// The platform in force: one for the program, or a test's own for a scope.
class Platform final {
 public:
  /// Installs this platform; the one in force before comes back when it is destroyed. Main thread.
  explicit Platform(const PlatformServices& services);
  ~Platform();
  Platform(const Platform&) = delete;
  Platform& operator=(const Platform&) = delete;

  /// Throws std::logic_error when none is installed. Any thread that its Platform outlives.
  static Platform& current();

  Clock& clock() const { return _services.clock; }
  RunLoop& mainRunLoop() const { return _services.mainRunLoop; }
  Log& log() const { return _services.log; }
  Signposts& signposts() const { return _services.signposts; }
  RandomSource& random() const { return _services.random; }
  StringTables& strings() const { return _services.strings; }
  SharedSettings& sharedSettings() const { return _services.sharedSettings; }
  FavoritesPersisters& favorites() const { return _services.favorites; }
  TransitLineService& transitLines() const { return _services.transitLines; }
  NetworkFailureDiagnosis& network() const { return _services.network; }
  MemoryPressure& memoryPressure() const { return _services.memoryPressure; }
  ActivityLauncher& activityLauncher() const { return _services.activityLauncher; }
  AnalyticsPipeline& analytics() const { return _services.analytics; }
  DeviceLockState& deviceLockState() const { return _services.deviceLockState; }
  KeyedArchive& archive() const { return _services.archive; }
  Compressor& compressor() const { return _services.compressor; }
  ImageResources& images() const { return _services.images; }
  TextSystem& text() const { return _services.text; }
  /// The shared renderer of shields; null where there is none.
  const std::shared_ptr<ShieldIconRenderer>& shieldRenderer() const { return _services.shieldRenderer; }

  /// The one object of class T that lives as long as this platform, made on the first call, once however many threads
  /// ask. `make` must not ask for another singleton.
  template <class T>
  std::shared_ptr<T> singleton(const std::function<std::shared_ptr<T>()>& make) {
    const std::lock_guard guard(_singletonsLock);
    std::shared_ptr<void>& slot = _singletons[&kClassKey<T>];
    if (!slot) slot = make();
    return std::static_pointer_cast<T>(slot);
  }

 private:
  template <class T>
  static inline char kClassKey = 0;

  PlatformServices _services;
  Platform* _previous;
  std::mutex _singletonsLock;
  /// By the address of the class's key: rows and views ask often, and a type_index would hash its whole name each time.
  std::unordered_map<const void*, std::shared_ptr<void>> _singletons;
};

}  // namespace nimbo

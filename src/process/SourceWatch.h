#pragma once

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/raii/GLibHandles.h"
#include "desktop/store/FavoritesEditor.h"
#include "desktop/system/GLibRunLoop.h"
#include "desktop/system/Paths.h"
#include "platform/SharedSettingsStore.h"

namespace nimbo {

/// Tells, while it lives, when what the rows are made from has changed, whoever changed it: the favorites, the setting
/// of RefreshSetting.h, the configuration of feeds, or a file of theirs on this machine. Main thread only.
class SourceWatch {
 public:
  /// What is given outlives this; `changed` may let go of it.
  SourceWatch(GLibRunLoop& runLoop, const Paths& paths, const FavoritesEditor& favorites,
              std::shared_ptr<SharedSettingsStore> settings, std::function<void()> changed);
  ~SourceWatch();

  /// Seconds for which events are gathered.
  static constexpr TimeInterval kSettling = 0.1;

 private:
  /// What of a folder is watched.
  struct Place {
    std::filesystem::path folder;
    std::string name;  ///< of a file or folder in it; empty: of any
    bool isState = false;
  };

  /// Watches everything anew: by the configuration of feeds, and the folders there are.
  void watch();
  /// Watches a file, or a folder that is missing, in the nearest folder there is; and what a link leads to.
  void watchFile(const std::filesystem::path& path, bool isState = false);
  void watchPlace(Place place);
  void readEvents();
  void settle();
  /// Tells one state of what is of interest in the state database from another.
  std::string stateMark() const;

  GLibRunLoop& _runLoop;
  const Paths& _paths;
  const FavoritesEditor& _favorites;
  std::shared_ptr<SharedSettingsStore> _settings;
  std::function<void()> _changed;
  std::string _stateMark;
  FileDescriptor _events;
  GSourceHandle _source;
  std::multimap<int, Place> _places;  // by inotify's number of the folder
  std::shared_ptr<Timer> _settling;   // while events are gathered
  bool _hasChanged = false;           // by something else than the state database
};

}  // namespace nimbo

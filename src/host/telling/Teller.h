#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <set>
#include <string>

#include "desktop/DesktopPlatform.h"
#include "desktop/store/ToldIncidents.h"
#include "host/notices/NoticeSender.h"
#include "host/telling/TellingRule.h"
#include "protocol/Lines.h"

namespace nimbo {

/// Turns the telling on or off, as the setting "notify" has it: from off to on, what runs now counts as told. Null on
/// success.
ErrorRef setNotify(DesktopPlatform& platform, const std::string& value);

/// Tells the user what begins, worsens and ends on his lines, as his settings have it, once whatever programs run. Main
/// thread only.
class Teller {
 public:
  struct Options {
    /// Whether it tells although the settings do not turn that on.
    bool isAsked = false;
    /// Whether it tells nothing where what it tells cannot be kept; else it remembers that as long as it lives.
    bool needsState = false;
    /// Of dates: a BCP 47 tag or POSIX name; empty: the environment's.
    std::string locale;
  };
  /// Why something was not told; null when all went well. What could not be shown is told with a later answer.
  using Completion = std::function<void(const ErrorRef& error)>;

  /// The platform is in force as long as this lives, and the run loop is that of GLib's default main context.
  Teller(GLibRunLoop& runLoop, DesktopPlatform& platform, Options options);
  /// What is not known to have been shown is told with the next answer, by whichever program has it.
  ~Teller();

  /// Whether answers are told of now.
  bool isOn() const;
  /// Takes an answer to "lines". `completion` hears once, perhaps before this returns; never after the teller went.
  void take(const protocol::Lines& lines, const Completion& completion);

 private:
  /// What is under way.
  struct Posting {
    Completion completion;
    std::size_t waiting = 0;  ///< answers to come
    ErrorRef error;           ///< the first

    void take(const ErrorRef& answer) {
      if (!error) error = answer;
      if (--waiting == 0) completion(error);
    }
  };
  /// Decides in the state that is kept, and notes there what is told; its error.
  ErrorRef decide(const ToldIncidents::Change& change);
  void forget(const std::vector<std::string>& keys);
  void post(Telling telling, const Completion& completion);

  GLibRunLoop& _runLoop;
  Options _options;
  std::shared_ptr<SharedSettingsStore> _settings;
  ToldIncidents _told;
  std::optional<ToldState> _remembered;   // in place of what cannot be kept
  std::optional<NoticeTexts> _texts;      // from the first answer that is to be told of
  std::unique_ptr<NoticeSender> _sender;  // from the first notice
  std::multiset<std::string> _underWay;   // keys of what is being shown
};

}  // namespace nimbo

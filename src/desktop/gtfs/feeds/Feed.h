#pragma once

#include <chrono>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

#include "platform/foundation/Outcome.h"

namespace nimbo {

/// Where a file of a feed is: a path of this machine, or an http or https address. Nothing else is read.
class FeedAddress {
 public:
  /// Reads what a user wrote: an address, a "file://" URL, or a path, which is taken from the working folder.
  static Outcome<FeedAddress> parse(std::string_view text);

  /// Whether it is an http or https address.
  bool isRemote() const { return _isRemote; }
  /// The address with everything in it, or the absolute path. Only for the configuration and for fetching.
  const std::string& text() const { return _text; }
  /// The path of a local one.
  std::filesystem::path path() const { return _text; }

  /// For messages and logs: without user name, password, query and fragment, in which keys are handed out.
  std::string publicText() const;

  bool operator==(const FeedAddress&) const = default;

 private:
  FeedAddress(std::string text, bool isRemote) : _text(std::move(text)), _isRemote(isRemote) {}
  std::string _text;
  bool _isRemote;
};

/// How old what a publisher says, or how far ahead its date, may be before it is no more taken for the present state:
/// an answer of a server, and a file, which somebody has to put there.
inline constexpr std::chrono::minutes kDefaultMaximumAlertsAge{15}, kDefaultMaximumFileAge{24 * 60};

/// A feed as the user set it up.
struct Feed {
  std::string name;
  FeedAddress staticFeed;  ///< a folder, a zip file or the address of one
  FeedAddress alerts;      ///< a file or an address
  /// Whether alerts without effect on the service, and those about accessibility alone, are incidents too.
  bool minorAlerts = false;
  /// How long after they were made the alerts count; absent for the default. 0, for a file alone, is for ever.
  std::optional<std::chrono::minutes> maximumAlertsAge = {};
  /// Whether the answer may have other entities alone: positions of vehicles and times of trips come beside the alerts.
  bool isCombined = false;

  bool operator==(const Feed&) const = default;
};

}  // namespace nimbo

#pragma once

#include <chrono>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>
#include <tuple>
#include <vector>

#include "platform/foundation/Outcome.h"

namespace nimbo {

/// What a server lets its clients in by. Kept apart from the address, and never shown.
struct FeedKey {
  std::vector<std::string> headers;  ///< "NAME: VALUE", sent as given
  std::string query;                 ///< goes to the end of the address's query; encoded

  /// Null for a line that can be sent as a header.
  static ErrorRef checkHeader(std::string_view line);
  /// The parameter of a query, its value encoded.
  static std::string parameter(std::string_view name, std::string_view value);

  bool isEmpty() const { return headers.empty() && query.empty(); }
  bool operator==(const FeedKey&) const = default;
};

/// Where a file of a feed is: a path of this machine, or an http or https address. Nothing else is read.
class FeedAddress {
 public:
  /// Reads what a user wrote: an address, a "file://" URL, or a path, which is taken from the working folder.
  static Outcome<FeedAddress> parse(std::string_view text);

  /// Whether it is an http or https address.
  bool isRemote() const { return _isRemote; }
  /// The address as it was given, or the absolute path. Only for the configuration and for fetching.
  const std::string& text() const { return _text; }
  const FeedKey& key() const { return _key; }
  FeedAddress withKey(FeedKey key) const;
  /// The same address with its query, in which keys are handed out, as the key.
  FeedAddress withQueryAsKey() const;
  /// The address with the query of its key. Only for fetching.
  std::string textWithKey() const;
  /// Tells it from others in files that hold no keys.
  std::string identity() const;
  /// The path of a local one.
  std::filesystem::path path() const { return _text; }

  /// For messages and logs: without user name, password, query and fragment, in which keys are handed out.
  std::string publicText() const;

  bool operator==(const FeedAddress&) const = default;

 private:
  FeedAddress(std::string text, bool isRemote) : _text(std::move(text)), _isRemote(isRemote) {}
  std::string _text;
  bool _isRemote;
  FeedKey _key;
};

/// How old what a publisher says, or how far ahead its date, may be before it is no more taken for the present state:
/// an answer of a server, and a file, which somebody has to put there.
inline constexpr int kLongestAlertsAgeMinutes = 60 * 24 * 366;
inline constexpr std::chrono::minutes kDefaultMaximumAlertsAge{15}, kDefaultMaximumFileAge{24 * 60};

/// A feed as the user set it up.
struct Feed {
  std::string name;
  FeedAddress staticFeed;  ///< a folder, a zip file or the address of one
  FeedAddress alerts;      ///< a file or an address
  /// A copy of the static feed, read where that cannot be fetched; remote.
  std::optional<FeedAddress> staticMirror = {};
  /// Whether alerts without effect on the service, and those about accessibility alone, are incidents too.
  bool minorAlerts = false;
  /// How long after they were made the alerts count; absent for the default. 0, for a file alone, is for ever.
  std::optional<std::chrono::minutes> maximumAlertsAge = {};
  /// Whether the answer may have other entities alone: positions of vehicles and times of trips come beside the alerts.
  bool isCombined = false;
  /// Whether other feeds go with the same alerts, which are fetched and kept once.
  bool sharesAlerts = false;
  /// Those that are set up.
  std::vector<Feed> siblings = {};

  /// By what name its alerts are kept.
  std::string nameOfAlerts() const { return sharesAlerts ? alerts.identity() : name; }
  /// By its settings alone.
  bool operator==(const Feed& other) const {
    const auto settings = [](const Feed& feed) {
      return std::tie(feed.name, feed.staticFeed, feed.alerts, feed.staticMirror, feed.minorAlerts,
                      feed.maximumAlertsAge, feed.isCombined);
    };
    return settings(*this) == settings(other);
  }
};

}  // namespace nimbo

#pragma once

#include <optional>
#include <span>
#include <stop_token>
#include <string_view>
#include <vector>

#include "desktop/gtfs/feeds/FeedSource.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// A line of a feed as somebody asked for it.
struct FoundLine {
  std::uint32_t index;        ///< in the static feed
  std::string formerRouteID;  ///< under which it was asked for, where no line of the feed has that any more; else empty
};

/// Each identifier's line in a feed; absent for one that the feed does not know: neither by its number nor
/// by an agency, short name and mode that only one line has.
std::vector<std::optional<FoundLine>> findLines(const StaticFeed& feed, const std::string& feedName,
                                                std::span<const MapItemIdentifierRef> identifiers);

/// What one feed says of lines.
struct FeedAnswer {
  TransitLineItems items;    ///< one for each identifier, null for one whose line `findLines` does not find
  std::optional<Date> asOf;  ///< when the publisher made the alerts; absent when he does not say, or none were needed
  std::optional<Date> answeredAt;  ///< when the alerts' server answered; absent without one
  bool isShared = false;           ///< that answer was there: no server was asked
};

/// What is held of a feed from one lookup to the next: the same question to the same bytes has the same answer, object
/// for object.
struct HeldAnswer {
  struct Question {
    std::uint64_t staticFeed = 0;  ///< its checksum: not every server tells a new state from an old one
    std::vector<std::pair<std::uint64_t, std::optional<TransitLineLocator>>> lines;
    std::string language;
    bool operator==(const Question&) const = default;
  };
  AlertsState alerts;
  Question question;
  std::size_t hash = 0;  ///< of the alerts that the answer was made of
  Date from, until;      ///< when it holds; never while both are the same
  FeedAnswer answer;
};

/// Looks lines up in one feed: an answer when there is a verdict on every line, else the reason why there is none:
/// their static data and their incidents by the alerts as they are now, texts in `language` (a BCP 47 tag). `held` is
/// that of the last lookup in this feed; `notBefore` is as `AlertsStore::load` has it. Blocks its thread.
Outcome<FeedAnswer> lookUpInFeed(const FeedSource& source, std::span<const MapItemIdentifierRef> identifiers,
                                 std::string_view language, HeldAnswer& held, Date notBefore,
                                 const std::stop_token& stop);

}  // namespace nimbo

#include <iostream>

#include "desktop/gtfs/static/LineItems.h"
#include "host/Commands.h"
#include "host/FeedAnswers.h"
#include "host/HostPlatform.h"
#include "host/ProgressLine.h"
#include "host/TerminalText.h"

namespace nimbo {

namespace {

/// Of a damaged database those that are left.
std::vector<TransitLineRef> favoriteLines(HostPlatform& platform) {
  const auto favorites = platform->favoritesEditor().left();
  require(favorites.error());
  std::vector<TransitLineRef> lines;
  for (const FavoriteRef& favorite : *favorites)
    if (const auto* line = dynamic_cast<const FavoriteTransitLine*>(favorite.get()); line && line->transitLine())
      lines.push_back(line->transitLine());
  return lines;
}

/// The number of the favourite that is written so, whether its feed still knows it or not.
std::uint64_t muidOfFavorite(HostPlatform& platform, const std::string& name) {
  for (const TransitLineRef& line : favoriteLines(platform))
    if (writtenNameOfLine(*line->identifier()) == name) return line->muid();
  throw CommandFailure("\"" + name + "\" is not among the favorites. \"favorite list\" shows them.");
}

}  // namespace

int runFavoriteAdd(const CommandContext& context, const std::vector<std::string>& names) {
  HostPlatform platform(context);
  protocol::DescribeLinesParams params;
  for (const std::string& name : names) params.lines.push_back({.id = name});
  const auto described = WidgetWithProgress(context).call(protocol::kDescribeLines, params);
  if (!described.failures.empty()) throw CommandFailure(described.failures.front().reason);
  std::vector<TransitLineRef> lines;
  for (std::size_t i = 0; i < names.size(); ++i) {
    if (i >= described.lines.size() || !described.lines[i].line)
      throw CommandFailure("No line is named \"" + names[i] +
                           "\": its feed has no such route. \"lines\" lists the lines there are.");
    lines.push_back(lineOf(*described.lines[i].line));
  }
  require(platform->favoritesEditor().add(lines));
  return kExitSuccess;
}

int runFavoriteRemove(const CommandContext& context, const std::vector<std::string>& names) {
  HostPlatform platform(context);
  std::vector<std::uint64_t> muids;
  muids.reserve(names.size());
  for (const std::string& name : names) muids.push_back(muidOfFavorite(platform, name));
  require(platform->favoritesEditor().remove(muids));
  return kExitSuccess;
}

int runFavoriteMove(const CommandContext& context, const std::string& name, int position) {
  HostPlatform platform(context);
  require(platform->favoritesEditor().move(muidOfFavorite(platform, name), static_cast<std::size_t>(position - 1)));
  return kExitSuccess;
}

int runFavoriteList(const CommandContext& context, bool json) {
  HostPlatform platform(context);
  const auto lines = favoriteLines(platform);
  printLines(lines, json);
  require(platform->favoritesEditor().list().error());
  if (lines.empty() && !json) std::cout << "No favorite lines. Add some with \"favorite add FEED:ROUTE_ID\".\n";
  return kExitSuccess;
}

}  // namespace nimbo

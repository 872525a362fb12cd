#include <iostream>

#include "desktop/gtfs/feeds/FeedCatalog.h"
#include "desktop/gtfs/feeds/FeedLibrary.h"
#include "desktop/gtfs/static/LineItems.h"
#include "host/Commands.h"
#include "host/HostPlatform.h"
#include "host/TerminalText.h"

namespace nimbo {

namespace {

/// Says which lines are gone, and which feeds cannot tell.
void tellGoneLines(const CommandContext& context, const std::vector<TransitLineRef>& lines) {
  std::vector<MapItemIdentifierRef> identifiers;
  identifiers.reserve(lines.size());
  for (const TransitLineRef& line : lines) identifiers.push_back(line->identifier());
  const FeedLibrary library(context.paths);
  const auto gone = FeedCatalog(library).goneLines(identifiers);
  if (!gone) throw CommandFailure(gone.error()->reason());
  for (const auto& line : gone->lines) printMessage(goneLineText(writtenNameOfLine(*line)));
  for (const ErrorRef& error : gone->errors) printMessage(error->reason());
}

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
  const FeedLibrary library(context.paths);
  std::vector<TransitLineRef> lines;
  for (const std::string& name : names) {
    auto line = FeedCatalog(library).lineNamed(name);
    if (!line) throw CommandFailure(line.error()->reason());
    lines.push_back(*line);
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

int runFavoriteList(const CommandContext& context) {
  HostPlatform platform(context);
  const auto lines = favoriteLines(platform);
  printLines(lines);
  require(platform->favoritesEditor().list().error());
  if (lines.empty()) std::cout << "No favorite lines. Add some with \"favorite add FEED:ROUTE_ID\".\n";
  tellGoneLines(context, lines);
  return kExitSuccess;
}

}  // namespace nimbo

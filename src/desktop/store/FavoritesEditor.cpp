#include "desktop/store/FavoritesEditor.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "desktop/gtfs/static/LineItems.h"
#include "desktop/store/FavoritesSeal.h"
#include "platform/transit/BasicTransitLineItem.h"

namespace nimbo {

namespace {

using nlohmann::json;

void put(json& object, const char* key, const std::optional<std::string>& text) {
  if (text) object[key] = *text;
}

std::optional<std::string> textOf(const json& object, const char* key) {
  const auto found = object.find(key);
  return found == object.end() ? std::nullopt : std::optional(found->get<std::string>());
}

json jsonOf(const TransitShield& shield) {
  json object{{"type", shield.shieldType}};
  put(object, "text", shield.shieldText);
  put(object, "color", shield.shieldColorString);
  put(object, "textColor", shield.shieldTextColorString);
  return object;
}

TransitShield shieldOf(const json& object) {
  return {object.at("type"), textOf(object, "text"), textOf(object, "color"), textOf(object, "textColor")};
}

json jsonOf(const TransitIcon& icon) {
  return {{"type", icon.iconType},
          {"carto", icon.cartoID},
          {"transitType", icon.defaultTransitType},
          {"attribute", {icon.iconAttributeKey, icon.iconAttributeValue}}};
}

TransitIcon iconOf(const json& object) {
  return {object.at("type"), object.at("carto"), object.at("transitType"), object.at("attribute").at(0),
          object.at("attribute").at(1)};
}

void put(json& object, const char* key, const TransitArtworkRef& artwork) {
  if (!artwork) return;
  json& fields = object[key] = {{"source", artwork->artworkSourceType()}, {"use", artwork->artworkUseType()}};
  if (const auto& shield = artwork->shieldDataSource()) fields["shield"] = jsonOf(*shield);
  if (const auto& icon = artwork->iconDataSource()) fields["icon"] = jsonOf(*icon);
  if (const auto& shield = artwork->iconFallbackShieldDataSource()) fields["fallbackShield"] = jsonOf(*shield);
  put(fields, "accessibilityText", artwork->accessibilityText());
}

TransitArtworkRef artworkOf(const json& object, const char* key) {
  const auto found = object.find(key);
  if (found == object.end()) return nullptr;
  TransitArtwork::Fields fields;
  fields.artworkSourceType = found->at("source");
  fields.artworkUseType = found->at("use");
  if (found->contains("shield")) fields.shieldDataSource = shieldOf(found->at("shield"));
  if (found->contains("icon")) fields.iconDataSource = iconOf(found->at("icon"));
  if (found->contains("fallbackShield")) fields.iconFallbackShieldDataSource = shieldOf(found->at("fallbackShield"));
  fields.accessibilityText = textOf(*found, "accessibilityText");
  return std::make_shared<const TransitArtwork>(std::move(fields));
}

MapItemIdentifierRef identifierOf(std::uint64_t muid, const json& content) {
  std::optional<TransitLineLocator> locator;
  if (const auto found = content.find("locator"); found != content.end())
    locator = TransitLineLocator{found->at("feed"), found->at("agency"), found->at("route"), found->at("shortName"),
                                 static_cast<TransitMode>(found->at("mode").get<std::int64_t>())};
  return std::make_shared<const MapItemIdentifier>(muid, std::move(locator));
}

TransitSystemRef systemOf(const json& content) {
  const auto found = content.find("system");
  if (found == content.end()) return nullptr;
  return std::make_shared<const TransitSystem>(found->at("muid").get<std::uint64_t>(), textOf(*found, "name"),
                                               artworkOf(*found, "artwork"));
}

}  // namespace

std::string contentOfFavoriteLine(const TransitLine& line) {
  json content{{"isBus", line.isBus()}};
  if (const auto& locator = line.identifier()->locator())
    content["locator"] = {{"feed", locator->feed},
                          {"agency", locator->agencyID},
                          {"route", locator->routeID},
                          {"shortName", locator->shortName},
                          {"mode", static_cast<std::int64_t>(locator->mode)}};
  put(content, "name", line.name());
  put(content, "color", line.lineColorString());
  put(content, "artwork", line.artwork());
  put(content, "modeArtwork", line.modeArtwork());
  put(content, "alternateArtwork", line.alternateArtwork());
  if (const auto& system = line.system()) {
    json& fields = content["system"] = {{"muid", system->muid()}};
    put(fields, "name", system->name());
    put(fields, "artwork", system->artwork());
  }
  return content.dump(-1, ' ', false, json::error_handler_t::replace);
}

TransitLineRef favoriteLineOfContent(std::uint64_t muid, std::string_view content) {
  try {
    const json object = json::parse(content);
    BasicTransitLineItem::Fields fields;
    fields.identifier = identifierOf(muid, object);
    fields.name = textOf(object, "name");
    fields.system = systemOf(object);
    fields.artwork = artworkOf(object, "artwork");
    fields.modeArtwork = artworkOf(object, "modeArtwork");
    fields.alternateArtwork = artworkOf(object, "alternateArtwork");
    fields.lineColorString = textOf(object, "color");
    fields.isBus = object.at("isBus");
    return std::make_shared<const BasicTransitLineItem>(std::move(fields));
  } catch (const json::exception&) {
    return nullptr;
  }
}

namespace {

/// The place of a favourite line in the order.
struct LineRow {
  std::int64_t id;
  std::int64_t position;
  std::uint64_t muid;
};

ErrorRef refusal(FavoritesError code, std::string reason, std::string subject = {}) {
  return Error::errorWithDomain_code_reason(std::string(kFavoritesErrorDomain), static_cast<std::int64_t>(code),
                                            std::move(reason), std::move(subject));
}

ErrorRef unknownLine(std::uint64_t muid) {
  return refusal(FavoritesError::unknown, "The line " + std::to_string(muid) + " is no favorite.");
}

/// As the user writes them, so many that a message stays short.
std::string textOfLines(const Favorites& favorites) {
  constexpr std::size_t kMostNamed = 20;
  std::string text;
  std::size_t count = 0;
  for (const FavoriteRef& favorite : favorites)
    if (const auto* line = dynamic_cast<const FavoriteTransitLine*>(favorite.get()); line && line->transitLine())
      if (++count <= kMostNamed)
        text.append(text.empty() ? "" : ", ").append(writtenNameOfLine(*line->transitLine()->identifier()));
  return count > kMostNamed ? text + " and others" : text;
}

/// An error while favourites are missing that a damaged database had; `left` are those that it still had.
ErrorRef lossOf(SQLiteConnection& connection, const Favorites& left) {
  SQLiteStatement query =
      connection.prepare("SELECT lostWith FROM favorites_seal WHERE id = 1 AND lostWith IS NOT NULL");
  if (!query.step()) return nullptr;
  const std::string names = textOfLines(left);
  return refusal(FavoritesError::lost,
                 "Not all favorites could be read in a damaged database, which is kept as " + query.text(0) + ": " +
                     std::to_string(left.size()) + (left.size() == 1 ? " of them is" : " of them are") + " left" +
                     (names.empty() ? "" : " (" + names + ")") +
                     ". Add those that you miss; that, or any other change of the favorites, ends this message.",
                 query.text(0));
}

bool wereSet(SQLiteConnection& connection) {
  return connection.integer(
             "SELECT EXISTS (SELECT 1 FROM favorites) OR EXISTS (SELECT 1 FROM favorites_seal WHERE wereSet)") != 0;
}

/// Another one for other favourites.
std::int64_t sealedDigest(SQLiteConnection& connection) {
  return connection.integer("SELECT digest FROM favorites_seal WHERE id = 1");
}

/// Whether a damaged database has just been replaced: what was asked for can be asked again.
bool isOfReplacement(const ErrorRef& error) {
  return error && error->domain() == kStateDatabaseErrorDomain &&
         error->code() == static_cast<std::int64_t>(StateDatabaseError::setAside);
}

std::vector<LineRow> lineRows(SQLiteConnection& connection) {
  std::vector<LineRow> rows;
  SQLiteStatement query =
      connection.prepare("SELECT id, position, muid FROM favorites WHERE kind = ? ORDER BY position, id");
  query.bind(1, kFavoriteKindTransitLine);
  while (query.step())
    rows.push_back({query.integer(0), query.integer(1), static_cast<std::uint64_t>(query.integer(2))});
  return rows;
}

auto findLine(std::vector<LineRow>& rows, std::uint64_t muid) {
  return std::find_if(rows.begin(), rows.end(), [muid](const LineRow& row) { return row.muid == muid; });
}

void append(SQLiteConnection& connection, const TransitLine& line) {
  SQLiteStatement insert = connection.prepare(
      "INSERT INTO favorites(position, kind, muid, content)"
      " VALUES ((SELECT coalesce(max(position), -1) + 1 FROM favorites), ?, ?, ?)");
  const std::string content = contentOfFavoriteLine(line);
  insert.bind(1, kFavoriteKindTransitLine);
  insert.bind(2, static_cast<std::int64_t>(line.muid()));
  insert.bind(3, content);
  insert.step();
}

void markAsSet(SQLiteConnection& connection) {
  connection.execute("UPDATE favorites_seal SET wereSet = 1, lostWith = NULL");
}

Favorites storedFavorites(SQLiteConnection& connection) {
  Favorites favorites;
  SQLiteStatement query = connection.prepare("SELECT kind, muid, content FROM favorites ORDER BY position, id");
  while (query.step()) {
    std::string kind = query.text(0);
    if (kind == kFavoriteKindTransitLine)
      favorites.push_back(std::make_shared<const FavoriteTransitLine>(
          favoriteLineOfContent(static_cast<std::uint64_t>(query.integer(1)), query.text(2))));
    else
      favorites.push_back(std::make_shared<const OtherFavorite>(std::move(kind)));
  }
  return favorites;
}

}  // namespace

FavoritesEditor::FavoritesEditor(std::shared_ptr<StateDatabase> database, FirstFavorites firstFavorites)
    : _database(std::move(database)), _firstFavorites(std::move(firstFavorites)) {
  if (!_database) throw std::invalid_argument("favorites need a database");
  if (!_firstFavorites) _firstFavorites = [] { return std::vector<TransitLineRef>(); };
}

Outcome<Favorites> FavoritesEditor::list() const { return read(Loss::isError); }

Outcome<Favorites> FavoritesEditor::left() const { return read(Loss::isPassedOver); }

std::int64_t FavoritesEditor::mark() const {
  std::int64_t mark = 0;
  const ErrorRef unread = _database->read([&](SQLiteConnection& connection) -> ErrorRef {
    if (wereSet(connection)) mark = sealedDigest(connection);
    return nullptr;
  });
  return unread ? 0 : mark;
}

Outcome<Favorites> FavoritesEditor::read(Loss loss) const {
  std::optional<Favorites> stored;
  const auto readOnce = [&] {
    return _database->read([&](SQLiteConnection& connection) -> ErrorRef {
      requireFittingFavorites(connection);
      const std::int64_t digest = sealedDigest(connection);
      if (*_memory && (*_memory)->digest == digest) {
        stored = (*_memory)->favorites;
        return nullptr;
      }
      if (wereSet(connection)) stored = storedFavorites(connection);
      if (loss == Loss::isPassedOver) return nullptr;
      if (ErrorRef lost = lossOf(connection, stored.value_or(Favorites()))) return lost;
      if (stored) *_memory = {digest, *stored};
      return nullptr;
    });
  };
  ErrorRef error = readOnce();
  if (isOfReplacement(error)) error = readOnce();
  if (error) return error;
  if (!stored) {
    stored.emplace();
    for (const TransitLineRef& line : _firstFavorites())
      stored->push_back(std::make_shared<const FavoriteTransitLine>(line));
  }
  return std::move(*stored);
}

ErrorRef FavoritesEditor::change(const StateDatabase::Work& work) {
  const auto changeOnce = [&] {
    return _database->write(
        [&](SQLiteConnection& connection) -> ErrorRef {
          requireFittingFavorites(connection);
          if (!wereSet(connection))
            for (const TransitLineRef& line : _firstFavorites()) append(connection, *line);
          markAsSet(connection);
          if (ErrorRef error = work(connection)) return error;
          sealFavorites(connection);
          return nullptr;
        },
        StateDatabase::Durability::power);
  };
  const ErrorRef error = changeOnce();
  return isOfReplacement(error) ? changeOnce() : error;
}

ErrorRef FavoritesEditor::add(const std::vector<TransitLineRef>& lines) {
  if (std::find(lines.begin(), lines.end(), nullptr) != lines.end())
    throw std::invalid_argument("a favorite line is not null");
  return change([&](SQLiteConnection& connection) -> ErrorRef {
    std::vector<LineRow> rows = lineRows(connection);
    for (const TransitLineRef& line : lines) {
      if (findLine(rows, line->muid()) != rows.end())
        return refusal(FavoritesError::duplicate,
                       line->name().value_or("The line " + std::to_string(line->muid())) + " is a favorite already.");
      append(connection, *line);
      rows.push_back({0, 0, line->muid()});
    }
    return nullptr;
  });
}

ErrorRef FavoritesEditor::remove(const std::vector<std::uint64_t>& muids) {
  return change([&](SQLiteConnection& connection) -> ErrorRef {
    std::vector<LineRow> rows = lineRows(connection);
    SQLiteStatement remove = connection.prepare("DELETE FROM favorites WHERE id = ?");
    for (const std::uint64_t muid : muids) {
      const auto row = findLine(rows, muid);
      if (row == rows.end()) return unknownLine(muid);
      remove.bind(1, row->id);
      remove.step();
      remove.reset();
      rows.erase(row);
    }
    return nullptr;
  });
}

ErrorRef FavoritesEditor::move(std::uint64_t muid, std::size_t position) {
  return change([&](SQLiteConnection& connection) -> ErrorRef {
    const std::vector<LineRow> places = lineRows(connection);
    std::vector<LineRow> rows = places;
    const auto row = findLine(rows, muid);
    if (row == rows.end()) return unknownLine(muid);
    if (position >= rows.size())
      return refusal(FavoritesError::position, "There is no position " + std::to_string(position + 1) + " among " +
                                                   std::to_string(rows.size()) +
                                                   (rows.size() == 1 ? " favorite line." : " favorite lines."));
    const auto target = rows.begin() + static_cast<std::ptrdiff_t>(position);
    if (row < target)
      std::rotate(row, row + 1, target + 1);
    else
      std::rotate(target, row, row + 1);
    // The lines change places among themselves: favourites of other kinds stay where they are.
    SQLiteStatement place = connection.prepare("UPDATE favorites SET position = ? WHERE id = ?");
    for (std::size_t i = 0; i < rows.size(); ++i) {
      if (rows[i].id == places[i].id) continue;
      place.bind(1, places[i].position);
      place.bind(2, rows[i].id);
      place.step();
      place.reset();
    }
    return nullptr;
  });
}

}  // namespace nimbo

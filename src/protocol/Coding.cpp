#include "protocol/Coding.h"

#include <cmath>
#include <limits>
#include <tuple>
#include <type_traits>

#include "protocol/Methods.h"
#include "protocol/Names.h"

namespace nimbo::protocol {

using nlohmann::json;

Malformed::Malformed(std::string where, std::string what)
    : std::runtime_error((where.empty() ? "it" : "\"" + where + "\"") + " must be " + what),
      place(std::move(where)),
      expected(std::move(what)) {}

namespace {

constexpr double kInfinite = std::numeric_limits<double>::infinity();

/// What holds for a member besides its type.
struct Rules {
  bool mayBeLeftOut = false;  ///< an absent optional is not written; else it stands as null
  double least = -kInfinite;  ///< bounds of its numbers
  double most = kInfinite;
};
constexpr Rules kMayBeLeftOut{.mayBeLeftOut = true};

/// Points that a width or height may have.
constexpr Rules kLength{.least = 0, .most = 100000};
/// Device pixels for each point.
constexpr Rules kScale{.least = 0.25, .most = 8};

/// As the setting has it.
constexpr Rules kRefreshSeconds{.mayBeLeftOut = true, .least = 30, .most = 3600};

constexpr Rules mayBeLeftOut(Rules rules) {
  rules.mayBeLeftOut = true;
  return rules;
}

template <class Message, class Value>
struct Field {
  const char* key;
  Value Message::*member;
  Rules rules{};
};
// Said for compilers that do not deduce the arguments of aggregates by themselves.
template <class Message, class Value>
Field(const char*, Value Message::*) -> Field<Message, Value>;
template <class Message, class Value>
Field(const char*, Value Message::*, Rules) -> Field<Message, Value>;

/// A member whose keys stand among the message's own.
template <class Message, class Value>
struct Embedded {
  std::optional<Value> Message::*member;
};
template <class Message, class Value>
Embedded(std::optional<Value> Message::*) -> Embedded<Message, Value>;

/// The fields of each message: the one place where its keys are spelled.
template <class Message>
constexpr int kFields = 0;

template <>
constexpr std::tuple<> kFields<Nothing>{};
template <>
constexpr std::tuple kFields<Bundle>{Field{"kind", &Bundle::kind}, Field{"identifier", &Bundle::identifier},
                                     Field{"containing", &Bundle::containing, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<DisplayModes>{Field{"compact", &DisplayModes::compact, kLength},
                                           Field{"expanded", &DisplayModes::expanded, kLength}};
template <>
constexpr std::tuple kFields<InitializeParams>{
    Field{"locale", &InitializeParams::locale, kMayBeLeftOut},
    Field{"textSize", &InitializeParams::textSize, kMayBeLeftOut},
    Field{"scale", &InitializeParams::scale, mayBeLeftOut(kScale)},
    Field{"appearance", &InitializeParams::appearance, kMayBeLeftOut},
    Field{"displayModes", &InitializeParams::displayModes, kMayBeLeftOut},
    Field{"activeDisplayMode", &InitializeParams::activeDisplayMode, kMayBeLeftOut},
    Field{"bundle", &InitializeParams::bundle, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<Initialized>{Field{"name", &Initialized::name}, Field{"version", &Initialized::version},
                                          Field{"protocol", &Initialized::protocol}};
template <>
constexpr std::tuple kFields<UpdateParams>{
    Field{"maxAge", &UpdateParams::maxAge, Rules{.mayBeLeftOut = true, .least = 0, .most = 86400}}};
template <>
constexpr std::tuple kFields<UpdateResult>{Field{"updateResult", &UpdateResult::updateResult},
                                           Field{"reason", &UpdateResult::reason, kMayBeLeftOut},
                                           Field{"downloading", &UpdateResult::isDownloading, kMayBeLeftOut},
                                           Field{"age", &UpdateResult::age, Rules{.mayBeLeftOut = true, .least = 0}},
                                           Field{"refreshSeconds", &UpdateResult::refreshSeconds, kRefreshSeconds}};
template <>
constexpr std::tuple kFields<Kept>{Field{"failure", &Kept::failure, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<ActiveDisplayModeParams>{
    Field{"mode", &ActiveDisplayModeParams::mode},
    Field{"maximumSize", &ActiveDisplayModeParams::maximumSize, mayBeLeftOut(kLength)}};
template <>
constexpr std::tuple kFields<TransitionParams>{Field{"size", &TransitionParams::size, kLength},
                                               Field{"displayModes", &TransitionParams::displayModes, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<TextSizeParams>{Field{"category", &TextSizeParams::category}};
template <>
constexpr std::tuple kFields<AppearanceParams>{Field{"appearance", &AppearanceParams::appearance}};
template <>
constexpr std::tuple kFields<ScaleParams>{Field{"scale", &ScaleParams::scale, kScale}};
template <>
constexpr std::tuple kFields<RowParams>{Field{"section", &RowParams::section}, Field{"row", &RowParams::row}};
template <>
constexpr std::tuple kFields<Selected>{Field{"selected", &Selected::selected}};
template <>
constexpr std::tuple kFields<HighlightParams>{Field{"section", &HighlightParams::section},
                                              Field{"row", &HighlightParams::row},
                                              Field{"highlighted", &HighlightParams::highlighted, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<Highlighted>{Field{"highlighted", &Highlighted::highlighted}};
template <>
constexpr std::tuple kFields<SnapshotParams>{Field{"rows", &SnapshotParams::rows, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<RenderParams>{
    Field{"offset", &RenderParams::offset, kMayBeLeftOut}, Field{"capacity", &RenderParams::capacity, kMayBeLeftOut},
    Field{"path", &RenderParams::path, kMayBeLeftOut}, Field{"surface", &RenderParams::surface, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<Rendered>{Field{"width", &Rendered::width}, Field{"height", &Rendered::height},
                                       Field{"stride", &Rendered::stride}, Field{"scale", &Rendered::scale}};
template <>
constexpr std::tuple kFields<ImageParams>{
    Field{"incident", &ImageParams::incident}, Field{"width", &ImageParams::width},
    Field{"offset", &ImageParams::offset, kMayBeLeftOut}, Field{"capacity", &ImageParams::capacity, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<AdvanceParams>{
    Field{"seconds", &AdvanceParams::seconds, Rules{.least = 0, .most = 366.0 * 86400}}};
template <>
constexpr std::tuple kFields<Advanced>{Field{"now", &Advanced::now}};
template <>
constexpr std::tuple kFields<OpenURLParams>{Field{"url", &OpenURLParams::url}};
template <>
constexpr std::tuple kFields<OpenUserActivityParams>{
    Field{"activityType", &OpenUserActivityParams::activityType}, Field{"userInfo", &OpenUserActivityParams::userInfo},
    Field{"application", &OpenUserActivityParams::application},
    Field{"requireUnlockPrompt", &OpenUserActivityParams::requireUnlockPrompt}};
template <>
constexpr std::tuple kFields<Opened>{Field{"opened", &Opened::opened}, Field{"error", &Opened::error, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<PreferredSizeParams>{Field{"size", &PreferredSizeParams::size}};
template <>
constexpr std::tuple kFields<LargestDisplayModeParams>{Field{"mode", &LargestDisplayModeParams::mode}};
template <>
constexpr std::tuple kFields<NoticeParams>{Field{"message", &NoticeParams::message}};
template <>
constexpr std::tuple kFields<LogParams>{Field{"level", &LogParams::level}, Field{"category", &LogParams::category},
                                        Field{"message", &LogParams::message}};

template <>
constexpr std::tuple kFields<Icon>{Field{"iconType", &Icon::iconType}, Field{"cartoID", &Icon::cartoID},
                                   Field{"defaultTransitType", &Icon::defaultTransitType},
                                   Field{"iconAttributeKey", &Icon::iconAttributeKey},
                                   Field{"iconAttributeValue", &Icon::iconAttributeValue}};
template <>
constexpr std::tuple kFields<Shield>{
    Field{"text", &Shield::text},           Field{"color", &Shield::color},
    Field{"textColor", &Shield::textColor}, Field{"type", &Shield::type},
    Field{"icon", &Shield::icon},           Field{"accessibilityText", &Shield::accessibilityText}};
template <>
constexpr std::tuple kFields<Artwork>{Field{"image", &Artwork::image, kMayBeLeftOut},
                                      Field{"shield", &Artwork::shield, kMayBeLeftOut},
                                      Field{"size", &Artwork::size, kMayBeLeftOut}, Field{"alpha", &Artwork::alpha}};
template <>
constexpr std::tuple kFields<Openable>{Field{"url", &Openable::url, kMayBeLeftOut},
                                       Field{"activityType", &Openable::activityType, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<TransitItem>{
    Field{"primaryText", &TransitItem::primaryText}, Field{"secondaryText", &TransitItem::secondaryText},
    Field{"artwork", &TransitItem::artwork}, Field{"artworkHidden", &TransitItem::artworkHidden},
    Field{"openable", &TransitItem::openable}};
template <>
constexpr std::tuple kFields<SummaryItem>{Field{"primaryText", &SummaryItem::primaryText},
                                          Field{"artworks", &SummaryItem::artworks},
                                          Field{"userActivityData", &SummaryItem::userActivityData}};
template <>
constexpr std::tuple kFields<ViewNode>{Field{"class", &ViewNode::className}, Field{"frame", &ViewNode::frame},
                                       Field{"hidden", &ViewNode::hidden}, Field{"views", &ViewNode::views}};
template <>
constexpr std::tuple kFields<Row>{Embedded{&Row::item},
                                  Field{"cell", &Row::cell},
                                  Field{"highlightable", &Row::highlightable},
                                  Field{"separatorStyleOverride", &Row::separatorStyleOverride},
                                  Field{"frame", &Row::frame},
                                  Field{"views", &Row::views}};
template <>
constexpr std::tuple kFields<ListItem>{Field{"summaryItem", &ListItem::summaryItem},
                                       Field{"expandedItems", &ListItem::expandedItems}};
template <>
constexpr std::tuple kFields<FetchError>{
    Field{"domain", &FetchError::domain}, Field{"code", &FetchError::code}, Field{"reason", &FetchError::reason},
    Field{"subject", &FetchError::subject, kMayBeLeftOut}, Field{"feed", &FetchError::feed, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<KnownIncident>{Field{"line", &KnownIncident::line}, Field{"title", &KnownIncident::title}};
template <>
constexpr std::tuple kFields<Snapshot>{Field{"displayMode", &Snapshot::displayMode},
                                       Field{"expanded", &Snapshot::expanded},
                                       Field{"visible", &Snapshot::visible},
                                       Field{"rowHeight", &Snapshot::rowHeight},
                                       Field{"maxNumberOfRows", &Snapshot::maxNumberOfRows},
                                       Field{"artworkColumnWidth", &Snapshot::artworkColumnWidth},
                                       Field{"preferredContentSize", &Snapshot::preferredContentSize},
                                       Field{"largestAvailableDisplayMode", &Snapshot::largestAvailableDisplayMode},
                                       Field{"result", &Snapshot::result},
                                       Field{"error", &Snapshot::error, kMayBeLeftOut},
                                       Field{"rows", &Snapshot::rows},
                                       Field{"listItem", &Snapshot::listItem},
                                       Field{"updateDates", &Snapshot::updateDates},
                                       Field{"knownIncidents", &Snapshot::knownIncidents},
                                       Field{"goneLines", &Snapshot::goneLines},
                                       Field{"asOf", &Snapshot::asOf},
                                       Field{"updated", &Snapshot::updated}};

template <>
constexpr std::tuple kFields<LineIncident>{Field{"id", &LineIncident::id},
                                           Field{"title", &LineIncident::title},
                                           Field{"text", &LineIncident::text},
                                           Field{"from", &LineIncident::from},
                                           Field{"until", &LineIncident::until},
                                           Field{"url", &LineIncident::url},
                                           Field{"severity", &LineIncident::severity},
                                           Field{"effect", &LineIncident::effect},
                                           Field{"cause", &LineIncident::cause},
                                           Field{"concern", &LineIncident::concern},
                                           Field{"new", &LineIncident::isNew},
                                           Field{"image", &LineIncident::hasImage},
                                           Field{"imageText", &LineIncident::imageText}};
template <>
constexpr std::tuple kFields<LineReport>{
    Field{"id", &LineReport::id},          Field{"muid", &LineReport::muid},
    Field{"name", &LineReport::name},      Field{"agency", &LineReport::agency},
    Field{"shield", &LineReport::shield},  Field{"state", &LineReport::state},
    Field{"reason", &LineReport::reason},  Field{"incidents", &LineReport::incidents},
    Field{"planned", &LineReport::planned}};
template <>
constexpr std::tuple kFields<Lines>{Field{"updated", &Lines::updated}, Field{"lines", &Lines::lines},
                                    Field{"error", &Lines::error, kMayBeLeftOut},
                                    Field{"asked", &Lines::asked, kMayBeLeftOut}, Field{"cut", &Lines::isCut}};
template <>
constexpr std::tuple kFields<LinesParams>{Field{"texts", &LinesParams::texts, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<MarkSeenParams>{Field{"ids", &MarkSeenParams::ids}};
template <>
constexpr std::tuple kFields<Download>{Field{"feed", &Download::feed}, Field{"received", &Download::received},
                                       Field{"length", &Download::length, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<Downloads>{Field{"downloads", &Downloads::downloads}};

template <>
constexpr std::tuple kFields<Incident>{Field{"muid", &Incident::muid},
                                       Field{"title", &Incident::title},
                                       Field{"summary", &Incident::summary},
                                       Field{"fullDescription", &Incident::fullDescription},
                                       Field{"startDate", &Incident::startDate},
                                       Field{"endDate", &Incident::endDate},
                                       Field{"lastUpdated", &Incident::lastUpdated},
                                       Field{"isBlocking", &Incident::isBlocking},
                                       Field{"affectedLines", &Incident::affectedLines},
                                       Field{"linkURL", &Incident::linkURL}};
template <>
constexpr std::tuple kFields<System>{Field{"name", &System::name}, Field{"artwork", &System::artwork}};
template <>
constexpr std::tuple kFields<Line>{Field{"muid", &Line::muid},
                                   Field{"name", &Line::name},
                                   Field{"system", &Line::system},
                                   Field{"artwork", &Line::artwork},
                                   Field{"alternateArtwork", &Line::alternateArtwork},
                                   Field{"incidents", &Line::incidents}};
template <>
constexpr std::tuple kFields<DecodeParams>{Field{"bytes", &DecodeParams::bytes}};
template <>
constexpr std::tuple kFields<Handoff>{Field{"text", &Handoff::text}, Field{"line", &Handoff::line},
                                      Field{"incidents", &Handoff::incidents}};

template <>
constexpr std::tuple kFields<Agency>{Field{"id", &Agency::id}, Field{"muid", &Agency::muid},
                                     Field{"name", &Agency::name}, Field{"artwork", &Agency::artwork}};
template <>
constexpr std::tuple kFields<FeedLine>{Field{"id", &FeedLine::id},
                                       Field{"muid", &FeedLine::muid},
                                       Field{"feed", &FeedLine::feed},
                                       Field{"routeID", &FeedLine::routeID},
                                       Field{"shortName", &FeedLine::shortName},
                                       Field{"longName", &FeedLine::longName},
                                       Field{"name", &FeedLine::name},
                                       Field{"agency", &FeedLine::agency},
                                       Field{"mode", &FeedLine::mode},
                                       Field{"color", &FeedLine::color},
                                       Field{"artwork", &FeedLine::artwork}};
template <>
constexpr std::tuple kFields<FindLinesParams>{
    Field{"query", &FindLinesParams::query}, Field{"feed", &FindLinesParams::feed, kMayBeLeftOut},
    Field{"offset", &FindLinesParams::offset, kMayBeLeftOut}, Field{"limit", &FindLinesParams::limit, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<FoundLines>{Field{"total", &FoundLines::total}, Field{"lines", &FoundLines::lines},
                                         Field{"failures", &FoundLines::failures}};
template <>
constexpr std::tuple kFields<LineKey>{
    Field{"id", &LineKey::id, kMayBeLeftOut}, Field{"muid", &LineKey::muid, kMayBeLeftOut},
    Field{"agencyID", &LineKey::agencyID, kMayBeLeftOut}, Field{"shortName", &LineKey::shortName, kMayBeLeftOut},
    Field{"mode", &LineKey::mode, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<DescribeLinesParams>{Field{"lines", &DescribeLinesParams::lines}};
template <>
constexpr std::tuple kFields<DescribedLine>{Field{"line", &DescribedLine::line}, Field{"gone", &DescribedLine::isGone}};
template <>
constexpr std::tuple kFields<DescribedLines>{Field{"lines", &DescribedLines::lines},
                                             Field{"failures", &DescribedLines::failures}};
template <>
constexpr std::tuple kFields<FeedKey>{Field{"headers", &FeedKey::headers, kMayBeLeftOut},
                                      Field{"query", &FeedKey::query, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<FeedDefinition>{
    Field{"name", &FeedDefinition::name},
    Field{"static", &FeedDefinition::staticFeed},
    Field{"alerts", &FeedDefinition::alerts},
    Field{"minorAlerts", &FeedDefinition::minorAlerts, kMayBeLeftOut},
    Field{"combined", &FeedDefinition::isCombined, kMayBeLeftOut},
    Field{"maximumAlertsAgeMinutes", &FeedDefinition::maximumAlertsAgeMinutes, kMayBeLeftOut},
    Field{"staticMirror", &FeedDefinition::staticMirror, kMayBeLeftOut},
    Field{"staticKey", &FeedDefinition::staticKey, kMayBeLeftOut},
    Field{"alertsKey", &FeedDefinition::alertsKey, kMayBeLeftOut},
    Field{"sharesAlerts", &FeedDefinition::sharesAlerts, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<CheckFeedParams>{Field{"feed", &CheckFeedParams::feed, kMayBeLeftOut},
                                              Field{"definition", &CheckFeedParams::definition, kMayBeLeftOut}};
template <>
constexpr std::tuple kFields<Skipped>{Field{"reason", &Skipped::reason}, Field{"count", &Skipped::count},
                                      Field{"example", &Skipped::example}};
template <>
constexpr std::tuple kFields<StaticFeedReport>{
    Field{"agencies", &StaticFeedReport::agencies}, Field{"lines", &StaticFeedReport::lines},
    Field{"trips", &StaticFeedReport::trips}, Field{"language", &StaticFeedReport::language},
    Field{"skipped", &StaticFeedReport::skipped}};
template <>
constexpr std::tuple kFields<AlertsReport>{Field{"version", &AlertsReport::version},
                                           Field{"timestamp", &AlertsReport::timestamp, kMayBeLeftOut},
                                           Field{"staleness", &AlertsReport::staleness, kMayBeLeftOut},
                                           Field{"gap", &AlertsReport::gap, kMayBeLeftOut},
                                           Field{"alerts", &AlertsReport::alerts},
                                           Field{"skipped", &AlertsReport::skipped},
                                           Field{"hasOthers", &AlertsReport::hasOthers},
                                           Field{"periods", &AlertsReport::periods},
                                           Field{"selectors", &AlertsReport::selectors},
                                           Field{"incidents", &AlertsReport::incidents},
                                           Field{"affectedLines", &AlertsReport::affectedLines},
                                           Field{"unfit", &AlertsReport::unfit}};
template <>
constexpr std::tuple kFields<FeedReport>{Field{"name", &FeedReport::name},
                                         Field{"static", &FeedReport::staticFeed, kMayBeLeftOut},
                                         Field{"staticError", &FeedReport::staticError, kMayBeLeftOut},
                                         Field{"alerts", &FeedReport::alerts, kMayBeLeftOut},
                                         Field{"alertsError", &FeedReport::alertsError, kMayBeLeftOut},
                                         Field{"otherFeed", &FeedReport::isOtherFeed}};
template <>
constexpr std::tuple kFields<CancelParams>{Field{"request", &CancelParams::request}};
template <>
constexpr std::tuple kFields<ProgressParams>{Field{"request", &ProgressParams::request},
                                             Field{"feed", &ProgressParams::feed},
                                             Field{"part", &ProgressParams::part},
                                             Field{"received", &ProgressParams::received},
                                             Field{"length", &ProgressParams::length, kMayBeLeftOut},
                                             Field{"done", &ProgressParams::done},
                                             Field{"total", &ProgressParams::total}};

template <class T>
constexpr bool kMayBeAbsent = false;
template <class T>
constexpr bool kMayBeAbsent<std::optional<T>> = true;
template <class T>
constexpr bool kMayBeAbsent<std::shared_ptr<T>> = true;

/// Runs `readPart`, and completes the place of what is wrong with it.
template <class ReadPart>
auto readAt(const std::string& key, ReadPart readPart) {
  try {
    return readPart();
  } catch (const Malformed& malformed) {
    throw Malformed(malformed.place.empty() ? key : key + "." + malformed.place, malformed.expected);
  }
}

std::string rangeText(const Rules& rules) { return json(rules.least).dump() + " to " + json(rules.most).dump(); }

double readNumber(const json& number, const Rules& rules, const char* expected) {
  const bool isNumber = number.is_number() && std::isfinite(number.get<double>());
  if (isNumber && number.get<double>() >= rules.least && number.get<double>() <= rules.most)
    return number.get<double>();
  throw Malformed("", rules.most < kInfinite ? expected + (" from " + rangeText(rules)) : expected);
}

/// How a value stands in JSON. This one is for messages.
template <class Value>
struct Coding {
  static json write(const Value& message) {
    json object = json::object();
    std::apply([&](const auto&... field) { (writeField(object, message, field), ...); }, kFields<Value>);
    return object;
  }
  static Value read(const json& object, const Rules&) {
    if (!object.is_object()) throw Malformed("", "an object");
    Value message;
    std::apply([&](const auto&... field) { (readField(object, message, field), ...); }, kFields<Value>);
    return message;
  }

 private:
  template <class Member>
  static void writeField(json& object, const Value& message, const Field<Value, Member>& field) {
    if constexpr (kMayBeAbsent<Member>)
      if (field.rules.mayBeLeftOut && !(message.*field.member)) return;
    object[field.key] = Coding<Member>::write(message.*field.member);
  }
  template <class Member>
  static void readField(const json& object, Value& message, const Field<Value, Member>& field) {
    const auto found = object.find(field.key);
    if (found == object.end() && field.rules.mayBeLeftOut) return;
    if (found == object.end()) throw Malformed(field.key, "given");
    message.*field.member = readAt(field.key, [&] { return Coding<Member>::read(*found, field.rules); });
  }
  template <class Member>
  static void writeField(json& object, const Value& message, const Embedded<Value, Member>& field) {
    if (message.*field.member) object.update(Coding<Member>::write(*(message.*field.member)));
  }
  template <class Member>
  static void readField(const json& object, Value& message, const Embedded<Value, Member>& field) {
    if (object.contains("class")) message.*field.member = Coding<Member>::read(object, {});
  }
};

template <>
struct Coding<std::string> {
  static json write(const std::string& text) { return text; }
  static std::string read(const json& found, const Rules&) {
    if (!found.is_string()) throw Malformed("", "a text");
    return found.get<std::string>();
  }
};

template <>
struct Coding<bool> {
  static json write(bool flag) { return flag; }
  static bool read(const json& found, const Rules&) {
    if (!found.is_boolean()) throw Malformed("", "true or false");
    return found.get<bool>();
  }
};

template <>
struct Coding<double> {
  /// A zero without a sign.
  static json write(double number) { return number + 0.0; }
  static double read(const json& number, const Rules& rules) { return readNumber(number, rules, "a number"); }
};

template <std::integral Integer>
struct Coding<Integer> {
  static json write(Integer number) { return number; }
  static Integer read(const json& found, const Rules&) {
    const bool fits = found.is_number_unsigned()  ? std::in_range<Integer>(found.get<std::uint64_t>())
                      : found.is_number_integer() ? std::in_range<Integer>(found.get<std::int64_t>())
                                                  : false;
    if (!fits) throw Malformed("", std::is_unsigned_v<Integer> ? "a whole number, 0 or more" : "a whole number");
    return found.get<Integer>();
  }
};

template <class Enumeration>
requires std::is_enum_v<Enumeration>
struct Coding<Enumeration> {
  static json write(Enumeration value) { return nameOf(value); }
  static Enumeration read(const json& found, const Rules&) {
    const auto value = found.is_string() ? named<Enumeration>(found.get_ref<const std::string&>()) : std::nullopt;
    if (!value) throw Malformed("", expected());
    return *value;
  }

 private:
  static std::string expected() {
    std::string names;
    for (const std::string_view name : kNames<Enumeration>)
      names += (names.empty() ? "\"" : ", \"") + std::string(name) + "\"";
    return "one of " + names;
  }
};

template <>
struct Coding<Size> {
  static json write(const Size& size) { return {size.width + 0.0, size.height + 0.0}; }
  static Size read(const json& found, const Rules& rules) {
    constexpr const char* kExpected = "[width, height], each a number";
    if (!found.is_array() || found.size() != 2) throw Malformed("", kExpected);
    return {readNumber(found[0], rules, kExpected), readNumber(found[1], rules, kExpected)};
  }
};

template <>
struct Coding<Rect> {
  static json write(const Rect& rect) { return {rect.x + 0.0, rect.y + 0.0, rect.width + 0.0, rect.height + 0.0}; }
  static Rect read(const json& found, const Rules& rules) {
    constexpr const char* kExpected = "[x, y, width, height], each a number";
    if (!found.is_array() || found.size() != 4) throw Malformed("", kExpected);
    const auto number = [&](std::size_t index) { return readNumber(found[index], rules, kExpected); };
    return {number(0), number(1), number(2), number(3)};
  }
};

template <>
struct Coding<Date> {
  static json write(Date date) { return isoTextOfDate(date); }
  static Date read(const json& found, const Rules&) {
    const auto date = found.is_string() ? dateFromISOText(found.get_ref<const std::string&>()) : std::nullopt;
    if (!date) throw Malformed("", "an ISO date");
    return *date;
  }
};

template <>
struct Coding<RequestID> {
  static json write(const RequestID& request) {
    return std::visit([](const auto& value) { return json(value); }, request);
  }
  static RequestID read(const json& found, const Rules&) {
    if (found.is_string()) return found.get<std::string>();
    if (found.is_number_integer()) return Coding<std::int64_t>::read(found, {});
    throw Malformed("", "a text or a whole number");
  }
};

template <class Value>
struct Coding<std::optional<Value>> {
  static json write(const std::optional<Value>& value) { return value ? Coding<Value>::write(*value) : json(); }
  static std::optional<Value> read(const json& found, const Rules& rules) {
    // What may be left out does not stand as null.
    if (found.is_null() && !rules.mayBeLeftOut) return std::nullopt;
    return Coding<Value>::read(found, rules);
  }
};

template <class Value>
struct Coding<std::shared_ptr<Value>> {
  static json write(const std::shared_ptr<Value>& value) { return Coding<Value>::write(*value); }
  static std::shared_ptr<Value> read(const json& found, const Rules& rules) {
    return std::make_shared<Value>(Coding<Value>::read(found, rules));
  }
};

template <class Element>
struct Coding<std::vector<Element>> {
  static json write(const std::vector<Element>& elements) {
    json array = json::array();
    for (const Element& element : elements) array.push_back(Coding<Element>::write(element));
    return array;
  }
  static std::vector<Element> read(const json& array, const Rules& rules) {
    if (!array.is_array()) throw Malformed("", "a list");
    std::vector<Element> elements;
    elements.reserve(array.size());
    for (const json& element : array)
      elements.push_back(
          readAt(std::to_string(elements.size()), [&] { return Coding<Element>::read(element, rules); }));
    return elements;
  }
};

template <class Value>
struct Coding<std::map<std::string, Value>> {
  static json write(const std::map<std::string, Value>& values) {
    json object = json::object();
    for (const auto& [key, value] : values) object[key] = Coding<Value>::write(value);
    return object;
  }
  static std::map<std::string, Value> read(const json& object, const Rules& rules) {
    if (!object.is_object()) throw Malformed("", "an object");
    std::map<std::string, Value> values;
    for (const auto& [key, value] : object.items())
      values[key] = readAt(key, [&value = value, &rules] { return Coding<Value>::read(value, rules); });
    return values;
  }
};

template <>
struct Coding<Item> {
  static json write(const Item& item) {
    return std::visit(
        []<class Alternative>(const Alternative& alternative) {
          json object = Coding<Alternative>::write(alternative);
          object["class"] = Alternative::kClass;
          return object;
        },
        item);
  }
  static Item read(const json& object, const Rules&) {
    const auto name = object.is_object() ? object.find("class") : object.end();
    if (name != object.end() && *name == TransitItem::kClass) return Coding<TransitItem>::read(object, {});
    if (name != object.end() && *name == SummaryItem::kClass) return Coding<SummaryItem>::read(object, {});
    throw Malformed("", "an item of a known class");
  }
};

}  // namespace

template <class Message>
json write(const Message& message) {
  return Coding<Message>::write(message);
}

template <class Message>
Message read(const json& found) {
  return Coding<Message>::read(found, {});
}

#define NIMBO_MESSAGE(Message)         \
  template json write(const Message&); \
  template Message read(const json&)

NIMBO_MESSAGE(Nothing);
NIMBO_MESSAGE(DisplayModes);
NIMBO_MESSAGE(InitializeParams);
NIMBO_MESSAGE(Initialized);
NIMBO_MESSAGE(UpdateParams);
NIMBO_MESSAGE(UpdateResult);
NIMBO_MESSAGE(Kept);
NIMBO_MESSAGE(ActiveDisplayModeParams);
NIMBO_MESSAGE(TransitionParams);
NIMBO_MESSAGE(TextSizeParams);
NIMBO_MESSAGE(AppearanceParams);
NIMBO_MESSAGE(ScaleParams);
NIMBO_MESSAGE(RowParams);
NIMBO_MESSAGE(Selected);
NIMBO_MESSAGE(HighlightParams);
NIMBO_MESSAGE(Highlighted);
NIMBO_MESSAGE(SnapshotParams);
NIMBO_MESSAGE(Snapshot);
NIMBO_MESSAGE(Lines);
NIMBO_MESSAGE(LineReport);
NIMBO_MESSAGE(LineIncident);
NIMBO_MESSAGE(LinesParams);
NIMBO_MESSAGE(MarkSeenParams);
NIMBO_MESSAGE(Downloads);
NIMBO_MESSAGE(RenderParams);
NIMBO_MESSAGE(Rendered);
NIMBO_MESSAGE(ImageParams);
NIMBO_MESSAGE(AdvanceParams);
NIMBO_MESSAGE(Advanced);
NIMBO_MESSAGE(DecodeParams);
NIMBO_MESSAGE(Handoff);
NIMBO_MESSAGE(FindLinesParams);
NIMBO_MESSAGE(FoundLines);
NIMBO_MESSAGE(DescribeLinesParams);
NIMBO_MESSAGE(DescribedLines);
NIMBO_MESSAGE(CheckFeedParams);
NIMBO_MESSAGE(FeedReport);
NIMBO_MESSAGE(CancelParams);
NIMBO_MESSAGE(ProgressParams);
NIMBO_MESSAGE(OpenURLParams);
NIMBO_MESSAGE(OpenUserActivityParams);
NIMBO_MESSAGE(Opened);
NIMBO_MESSAGE(PreferredSizeParams);
NIMBO_MESSAGE(LargestDisplayModeParams);
NIMBO_MESSAGE(NoticeParams);
NIMBO_MESSAGE(LogParams);

}  // namespace nimbo::protocol

#include "protocol/Coding.h"

#include <tuple>
#include <type_traits>

#include "protocol/Handoff.h"

namespace nimbo::protocol {

using nlohmann::json;

Malformed::Malformed(std::string where, std::string what)
    : std::runtime_error((where.empty() ? "it" : "\"" + where + "\"") + " must be " + what),
      place(std::move(where)),
      expected(std::move(what)) {}

namespace {

/// A member of a message. It is always there: an absent optional stands as null.
template <class Message, class Value>
struct Field {
  const char* key;
  Value Message::*member;
};
// Said for compilers that do not deduce the arguments of aggregates by themselves.
template <class Message, class Value>
Field(const char*, Value Message::*) -> Field<Message, Value>;

/// The fields of each message: the one place where its keys are spelled.
template <class Message>
constexpr int kFields = 0;

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

/// Runs `readPart`, and completes the place of what is wrong with it.
template <class ReadPart>
auto readAt(const std::string& key, ReadPart readPart) {
  try {
    return readPart();
  } catch (const Malformed& malformed) {
    throw Malformed(malformed.place.empty() ? key : key + "." + malformed.place, malformed.expected);
  }
}

/// How a value stands in JSON. This one is for messages.
template <class Value>
struct Coding {
  static json write(const Value& message) {
    json object = json::object();
    std::apply([&](const auto&... field) { (writeField(object, message, field), ...); }, kFields<Value>);
    return object;
  }
  static Value read(const json& object) {
    if (!object.is_object()) throw Malformed("", "an object");
    Value message;
    std::apply([&](const auto&... field) { (readField(object, message, field), ...); }, kFields<Value>);
    return message;
  }

 private:
  template <class Member>
  static void writeField(json& object, const Value& message, const Field<Value, Member>& field) {
    object[field.key] = Coding<Member>::write(message.*field.member);
  }
  template <class Member>
  static void readField(const json& object, Value& message, const Field<Value, Member>& field) {
    const auto found = object.find(field.key);
    if (found == object.end()) throw Malformed(field.key, "given");
    message.*field.member = readAt(field.key, [&] { return Coding<Member>::read(*found); });
  }
};

template <>
struct Coding<std::string> {
  static json write(const std::string& text) { return text; }
  static std::string read(const json& found) {
    if (!found.is_string()) throw Malformed("", "a text");
    return found.get<std::string>();
  }
};

template <>
struct Coding<bool> {
  static json write(bool flag) { return flag; }
  static bool read(const json& found) {
    if (!found.is_boolean()) throw Malformed("", "true or false");
    return found.get<bool>();
  }
};

template <std::integral Integer>
struct Coding<Integer> {
  static json write(Integer number) { return number; }
  static Integer read(const json& found) {
    const bool fits = std::is_unsigned_v<Integer>  ? found.is_number_unsigned()
                      : found.is_number_unsigned() ? found.get<std::uint64_t>() <= INT64_MAX
                                                   : found.is_number_integer();
    if (!fits) throw Malformed("", std::is_unsigned_v<Integer> ? "a whole number, 0 or more" : "a whole number");
    return found.get<Integer>();
  }
};

template <>
struct Coding<Date> {
  static json write(Date date) { return isoTextOfDate(date); }
  static Date read(const json& found) {
    const auto date = found.is_string() ? dateFromISOText(found.get_ref<const std::string&>()) : std::nullopt;
    if (!date) throw Malformed("", "an ISO date");
    return *date;
  }
};

template <class Value>
struct Coding<std::optional<Value>> {
  static json write(const std::optional<Value>& value) { return value ? Coding<Value>::write(*value) : json(); }
  static std::optional<Value> read(const json& found) {
    if (found.is_null()) return std::nullopt;
    return Coding<Value>::read(found);
  }
};

template <class Element>
struct Coding<std::vector<Element>> {
  static json write(const std::vector<Element>& elements) {
    json array = json::array();
    for (const Element& element : elements) array.push_back(Coding<Element>::write(element));
    return array;
  }
  static std::vector<Element> read(const json& array) {
    if (!array.is_array()) throw Malformed("", "a list");
    std::vector<Element> elements;
    elements.reserve(array.size());
    for (const json& element : array)
      elements.push_back(readAt(std::to_string(elements.size()), [&] { return Coding<Element>::read(element); }));
    return elements;
  }
};

}  // namespace

template <class Message>
json write(const Message& message) {
  return Coding<Message>::write(message);
}

template <class Message>
Message read(const json& found) {
  return Coding<Message>::read(found);
}

template json write(const DecodeParams&);
template json write(const Handoff&);
template DecodeParams read(const json&);
template Handoff read(const json&);

}  // namespace nimbo::protocol

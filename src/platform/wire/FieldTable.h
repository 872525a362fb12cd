#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string_view>
#include <tuple>
#include <type_traits>
#include <vector>

#include "platform/wire/Record.h"
#include "platform/wire/Scalar.h"

namespace nimbo {

/// One field of a record.
///
/// What the member is says how it is written and when it is present:
/// - `Scalar<T>`, `NamedScalar<names>`: with a presence of their own;
/// - bool, integer, enumeration, string: present unless 0 or empty;
/// - `std::optional<T>`: present when it holds a value. A vector in it is a message with the elements as field 1, so
/// that
///   an empty list differs from an absent one;
/// - `std::shared_ptr` of a record, or of a class with a `WireObject`: a message, present unless null;
/// - `std::vector<T>`, `std::shared_ptr<std::vector<T>>`: repeated;
/// - a struct with a `RecordTable`: a message.
/// Dates are int64, microseconds since 1970-01-01T00:00:00Z.
template <class Struct, class Member>
struct Field {
  std::uint32_t number;
  std::string_view name;  ///< key in the dictionary representation; a literal
  Member Struct::*member;
};
// Said for compilers that do not deduce the arguments of aggregates by themselves.
template <class Struct, class Member>
Field(std::uint32_t, std::string_view, Member Struct::*) -> Field<Struct, Member>;

/// The fields of a struct: a specialisation has `static constexpr std::tuple fields{Field{...}, ...}`, ascending.
template <class Struct>
struct RecordTable;

/// How an immutable class stands in a record: a specialisation has `fields(const Class&)`, answering a struct with a
/// table, and `make(fill)`, answering the shared object of the fields that `bool fill(Struct&)` sets, or null when that
/// answers false.
template <class Class>
struct WireObject;

/// Calls `visit(field)` for each field in order.
template <class Struct, class Visitor>
void forEachField(Visitor visit) {
  std::apply([&](const auto&... field) { (visit(field), ...); }, RecordTable<Struct>::fields);
}

/// Calls `visit(field)` for each field, from the last to the first.
template <class Struct, class Visitor>
void forEachFieldBackwards(Visitor visit) {
  constexpr auto& fields = RecordTable<Struct>::fields;
  constexpr std::size_t count = std::tuple_size_v<std::remove_cvref_t<decltype(fields)>>;
  [&]<std::size_t... Index>(std::index_sequence<Index...>) { (visit(std::get<count - 1 - Index>(fields)), ...); }
  (std::make_index_sequence<count>());
}

/// The first argument of a template type: what an optional, a shared pointer or a vector holds.
template <class T>
struct ContentOf;
template <template <class...> class Template, class First, class... Rest>
struct ContentOf<Template<First, Rest...>> {
  using type = First;
};
template <class T>
using ContentOfT = typename ContentOf<T>::type;

template <class T, template <class...> class Template>
inline constexpr bool kIsA = false;
template <template <class...> class Template, class... Arguments>
inline constexpr bool kIsA<Template<Arguments...>, Template> = true;

template <class T>
concept ScalarField = requires(T scalar) {
  scalar.isPresent;
  scalar.value;
};
template <class T>
concept NamedField = ScalarField<T> && requires(T scalar) {
  scalar.valueOrZero();
};
template <class T>
concept OptionalField = kIsA<T, std::optional>;
template <class T>
concept SharedField = kIsA<T, std::shared_ptr>;
template <class T>
concept VectorField = kIsA<T, std::vector>;
/// A repeated field that is shared by reference.
template <class T>
concept SharedVectorField = SharedField<T> && VectorField<typename T::element_type>;
/// A nested record, mutable and shared by reference.
template <class T>
concept SharedRecordField = SharedField<T> && std::is_base_of_v<CodableRecord, typename T::element_type> &&
    (!std::is_const_v<typename T::element_type>);
/// An immutable object with a `WireObject`.
template <class T>
concept SharedObjectField = SharedField<T> && std::is_const_v<typename T::element_type>;
template <class T>
concept NumberValue = std::is_arithmetic_v<T> || std::is_enum_v<T>;
template <class T>
concept StructValue = requires {
  RecordTable<T>::fields;
};

template <SharedObjectField T>
using WireObjectOf = WireObject<std::remove_const_t<typename T::element_type>>;

}  // namespace nimbo

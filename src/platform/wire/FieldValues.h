#pragma once

#include "platform/foundation/Hash.h"
#include "platform/wire/FieldCoding.h"

// Comparing, hashing, describing, copying and merging the fields of a struct with a table.
namespace nimbo {

template <class Struct>
bool fieldsAreEqual(const Struct& a, const Struct& b);

template <class T>
bool membersAreEqual(const T& a, const T& b) {
  if constexpr (ScalarField<T>) {
    return a.isPresent == b.isPresent && (!a.isPresent || a.value == b.value);
  } else if constexpr (SharedRecordField<T>) {
    return a && b ? a->isEqual(b.get()) : a == b;
  } else if constexpr (SharedObjectField<T>) {
    return a == b || (a && b && fieldsAreEqual(WireObjectOf<T>::fields(*a), WireObjectOf<T>::fields(*b)));
  } else if constexpr (SharedVectorField<T> || OptionalField<T>) {
    return a && b ? membersAreEqual(*a, *b) : !a == !b;
  } else if constexpr (VectorField<T>) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i)
      if (!membersAreEqual(a[i], b[i])) return false;
    return true;
  } else if constexpr (StructValue<T>) {
    return fieldsAreEqual(a, b);
  } else {
    return a == b;
  }
}

template <class Struct>
bool fieldsAreEqual(const Struct& a, const Struct& b) {
  bool equal = true;
  forEachField<Struct>([&](const auto& field) { equal = equal && membersAreEqual(a.*field.member, b.*field.member); });
  return equal;
}

template <class Struct>
std::uint64_t hashOfFields(const Struct& record);

template <class T>
std::uint64_t hashOfMember(const T& member) {
  if constexpr (ScalarField<T>) {
    return member.isPresent ? hashOfMember(member.value) : 0;
  } else if constexpr (std::is_same_v<T, double>) {
    return hashOfDouble(member);
  } else if constexpr (NumberValue<T>) {
    return static_cast<std::uint64_t>(member) * kHashMultiplier;
  } else if constexpr (std::is_same_v<T, Date>) {
    return hashOfMember(member.time_since_epoch().count());
  } else if constexpr (std::is_same_v<T, std::string>) {
    return hashOfBytes(member);
  } else if constexpr (SharedRecordField<T>) {
    return member ? member->hash() : 0;
  } else if constexpr (SharedObjectField<T>) {
    return member ? hashOfFields(WireObjectOf<T>::fields(*member)) : 0;
  } else if constexpr (SharedVectorField<T> || OptionalField<T>) {
    return member ? hashOfMember(*member) : 0;
  } else if constexpr (VectorField<T>) {
    return member.size();
  } else {
    return hashOfFields(member);
  }
}

template <class Struct>
std::uint64_t hashOfFields(const Struct& record) {
  std::uint64_t hash = 0;
  forEachField<Struct>([&](const auto& field) { hash ^= hashOfMember(record.*field.member); });
  return hash;
}

template <class Struct>
std::shared_ptr<const BoxedDictionary> dictionaryOfFields(const Struct& record);

/// A present value as an object.
template <class T>
ObjectRef objectOfValue(const T& value) {
  if constexpr (std::is_enum_v<T>) {
    return box(static_cast<std::int64_t>(value));
  } else if constexpr (std::is_arithmetic_v<T> || std::is_same_v<T, Date> || std::is_same_v<T, std::string>) {
    return box(value);
  } else if constexpr (SharedRecordField<T>) {
    return value->dictionaryRepresentation();
  } else if constexpr (SharedObjectField<T>) {
    return dictionaryOfFields(WireObjectOf<T>::fields(*value));
  } else if constexpr (VectorField<T>) {
    std::vector<ObjectRef> objects;
    objects.reserve(value.size());
    for (const auto& element : value) objects.push_back(objectOfValue(element));
    return std::make_shared<const BoxedArray>(std::move(objects));
  } else if constexpr (OptionalField<T>) {
    BoxedDictionary::Entries entries;
    if (value) entries.emplace("value", objectOfValue(*value));
    return std::make_shared<const BoxedDictionary>(std::move(entries));
  } else {
    return dictionaryOfFields(value);
  }
}

template <class Struct>
std::shared_ptr<const BoxedDictionary> dictionaryOfFields(const Struct& record) {
  BoxedDictionary::Entries entries;
  forEachField<Struct>([&]<class T>(const Field<Struct, T>& field) {
    const T& member = record.*field.member;
    if (!fieldIsPresent(member)) return;
    ObjectRef object;
    if constexpr (NamedField<T>)
      object = box(member.name());
    else if constexpr (ScalarField<T>)
      object = objectOfValue(member.value);
    else if constexpr (SharedVectorField<T>)
      object = member->empty() ? nullptr : objectOfValue(*member);
    else if constexpr (OptionalField<T>)
      object = objectOfValue(*member);
    else
      object = objectOfValue(member);
    if (object) entries.emplace(field.name, std::move(object));
  });
  return std::make_shared<const BoxedDictionary>(std::move(entries));
}

template <class Struct>
void mergeFields(Struct& mine, const Struct& theirs);

template <class T>
void mergeMember(T& mine, const T& theirs) {
  if (!fieldIsPresent(theirs)) return;
  if constexpr (VectorField<T>) {
    const T added = theirs;  // NOLINT(performance-unnecessary-copy-initialization): it may be `mine`
    mine.insert(mine.end(), added.begin(), added.end());
  } else if constexpr (SharedVectorField<T>) {
    if (theirs->empty()) return;
    if (!mine) mine = std::make_shared<typename T::element_type>();
    mergeMember(*mine, *theirs);
  } else if constexpr (SharedRecordField<T>) {
    if (mine)
      mine->mergeFrom(*theirs);
    else
      mine = theirs;
  } else if constexpr (SharedObjectField<T>) {
    if (!mine) {
      mine = theirs;
      return;
    }
    mine = WireObjectOf<T>::make([&](auto& fields) {
      fields = WireObjectOf<T>::fields(*mine);
      mergeFields(fields, std::remove_cvref_t<decltype(fields)>(WireObjectOf<T>::fields(*theirs)));
      return true;
    });
  } else if constexpr (OptionalField<T>) {
    if constexpr (StructValue<ContentOfT<T>>) {
      if (!mine) mine.emplace();
      mergeFields(*mine, *theirs);
    } else {
      mine = theirs;
    }
  } else {
    mine = theirs;
  }
}

template <class Struct>
void mergeFields(Struct& mine, const Struct& theirs) {
  forEachField<Struct>([&](const auto& field) { mergeMember(mine.*field.member, theirs.*field.member); });
}

/// Copies a present member over `to`, nested records by reference.
template <class T>
void copyMember(T& to, const T& from) {
  if (!fieldIsPresent(from)) return;
  if constexpr (SharedVectorField<T>) {
    if (from->empty() || from == to) return;
    if (!to) to = std::make_shared<typename T::element_type>();
    *to = *from;
  } else {
    to = from;
  }
}

/// A copy of a present member, nested records included. Objects that never change are shared.
template <class T>
void deepCopyMember(T& to, const T& from) {
  copyMember(to, from);
  if constexpr (SharedRecordField<T>) {
    if (to) to = to->copyWithZone();
  } else if constexpr (SharedVectorField<T>) {
    if (!to) return;
    for (auto& element : *to) deepCopyMember(element, element);
  }
}

}  // namespace nimbo

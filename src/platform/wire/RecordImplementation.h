#pragma once

#include <typeinfo>

#include "platform/archive/SecureCoding.h"
#include "platform/foundation/Object.h"
#include "platform/wire/FieldValues.h"
#include "platform/wire/Record.h"

// The operations of records, for the sources that instantiate them.

namespace nimbo {

template <class Derived, class Fields, class Base>
bool Record<Derived, Fields, Base>::readFrom(ProtobufReader& reader) {
  return readFields(reader, _fields);
}

template <class Derived, class Fields, class Base>
void Record<Derived, Fields, Base>::writeTo(ProtobufWriter& writer) const {
  writeFields(writer, _fields);
}

template <class Derived, class Fields, class Base>
void Record<Derived, Fields, Base>::copyTo(Derived& other) const {
  Fields& theirs = static_cast<Record&>(other)._fields;
  forEachField<Fields>([&](const auto& field) { copyMember(theirs.*field.member, _fields.*field.member); });
}

template <class Derived, class Fields, class Base>
std::shared_ptr<Derived> Record<Derived, Fields, Base>::copyWithZone() const {
  auto copy = std::make_shared<Derived>();
  Fields& theirs = static_cast<Record&>(*copy)._fields;
  forEachField<Fields>([&](const auto& field) { deepCopyMember(theirs.*field.member, _fields.*field.member); });
  return copy;
}

template <class Derived, class Fields, class Base>
void Record<Derived, Fields, Base>::mergeFrom(const Derived& other) {
  mergeFields(_fields, static_cast<const Record&>(other)._fields);
}

template <class Derived, class Fields, class Base>
bool Record<Derived, Fields, Base>::isEqual(const Object* other) const {
  return other && typeid(*other) == typeid(Derived) &&
         fieldsAreEqual(_fields, static_cast<const Derived*>(other)->fields());
}

template <class Derived, class Fields, class Base>
std::uint64_t Record<Derived, Fields, Base>::hash() const {
  return hashOfFields(_fields);
}

template <class Derived, class Fields, class Base>
std::shared_ptr<const BoxedDictionary> Record<Derived, Fields, Base>::dictionaryRepresentation() const {
  return dictionaryOfFields(_fields);
}

template <class Derived, class Fields, class Base>
std::string Record<Derived, Fields, Base>::description() const {
  return Object::description() + " " + dictionaryRepresentation()->description();
}

/// Key of a record's encoded bytes in an archive.
inline constexpr std::string_view kArchivedRecordKey = "record";

/// Writes the record's bytes: an archive holds records in the form that hand-offs have, by the same schema.
inline void encodeRecord(const CodableRecord& record, KeyedEncoder& coder) {
  coder.encodeBytes_forKey(record.data(), kArchivedRecordKey);
}

/// Reads what `encodeRecord` wrote. Bytes that are missing or broken fail the decoding.
template <class Record>
ObjectRef decodeRecord(KeyedDecoder& coder) {
  const std::optional<Bytes> bytes = coder.decodeBytesForKey(kArchivedRecordKey);
  if (!bytes) {
    coder.failWithReason("the bytes of the record are missing");
    return nullptr;
  }
  ProtobufReader reader(*bytes);
  auto record = std::make_shared<Record>();
  if (record->readFrom(reader)) return record;
  coder.failWithReason("the record is broken: " + reader.failureText());
  return nullptr;
}

}  // namespace nimbo

#pragma once

#include "platform/wire/CodableRecord.h"

namespace nimbo {

/// A record whose fields are the members of the struct `Fields`, in one table that all its operations follow. A
/// record's header says `extern template class Record<...>`; its source includes RecordImplementation.h, specialises
/// `RecordTable<Fields>` and instantiates the class.
template <class Derived, class Fields, class Base = Object>
class Record : public Base, public CodableRecord {
 public:
  /// Every field absent, every number 0.
  Record() = default;
  explicit Record(Fields fields) : _fields(std::move(fields)) {}

  const Fields& fields() const { return _fields; }

  bool readFrom(ProtobufReader& reader) override;
  void writeTo(ProtobufWriter& writer) const override;

  /// Sets the other's fields to those present here, messages by reference; a repeated field with elements takes the
  /// place of the other's.
  void copyTo(Derived& other) const;
  /// A new record with copies of all nested records.
  std::shared_ptr<Derived> copyWithZone() const;
  /// Takes over the fields present in the other: messages present in both are merged, those only there are shared,
  /// repeated elements are appended.
  void mergeFrom(const Derived& other);

  /// Exactly the same class, and each field absent in both or equal. An absent list differs from an empty one.
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::shared_ptr<const BoxedDictionary> dictionaryRepresentation() const override;
  /// The root object's description and the fields.
  std::string description() const override;

 protected:
  Fields _fields;
};

}  // namespace nimbo

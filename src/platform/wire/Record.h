#pragma once

#include <memory>

#include "platform/foundation/Boxed.h"
#include "platform/wire/ProtobufReader.h"
#include "platform/wire/ProtobufWriter.h"

namespace nimbo {

/// A record with a Protocol Buffers form. A plain mutable value, shared by reference; locks nothing.
class CodableRecord {
 public:
  virtual ~CodableRecord() = default;

  /// Reads fields over those held, up to the reader's length. False when the bytes are cut short or a field cannot be
  /// read; what was read before stays.
  virtual bool readFrom(ProtobufReader& reader) = 0;

  /// Writes the fields that are present, so that they stand in ascending order of their numbers. Unknown fields are not
  /// kept.
  virtual void writeTo(ProtobufWriter& writer) const = 0;

  /// The present fields by name.
  virtual std::shared_ptr<const BoxedDictionary> dictionaryRepresentation() const = 0;

  /// The encoded bytes, as `writeTo` writes them.
  Bytes data() const {
    ProtobufWriter writer;
    writeTo(writer);
    return writer.takeBytes();
  }
};

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

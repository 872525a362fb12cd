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

}  // namespace nimbo

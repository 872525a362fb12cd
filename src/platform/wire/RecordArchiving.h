#pragma once

#include "platform/archive/SecureCoding.h"
#include "platform/wire/CodableRecord.h"

namespace nimbo {

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

#pragma once

#include "platform/foundation/Date.h"
#include "platform/wire/FieldTable.h"
#include "platform/wire/Scalar.h"

// Writing (backwards, as ProtobufWriter does) and reading the fields of a struct with a table.
namespace nimbo {

template <class T>
bool fieldIsPresent(const T& member) {
  if constexpr (ScalarField<T>)
    return member.isPresent;
  else if constexpr (OptionalField<T> || SharedField<T>)
    return static_cast<bool>(member);
  else if constexpr (NumberValue<T>)
    return member != T{};
  else
    return !member.empty();
}

template <class Struct>
void writeFields(ProtobufWriter& writer, const Struct& record);

template <class T>
void writeMember(ProtobufWriter& writer, std::uint32_t number, const T& member);

template <class T>
void writeValue(ProtobufWriter& writer, std::uint32_t number, const T& value) {
  if constexpr (std::is_same_v<T, bool>) {
    writer.writeBool(value, number);
  } else if constexpr (std::is_same_v<T, double>) {
    writer.writeDouble(value, number);
  } else if constexpr (std::is_unsigned_v<T>) {
    writer.writeUInt64(value, number);
  } else if constexpr (NumberValue<T>) {
    writer.writeInt64(static_cast<std::int64_t>(value), number);
  } else if constexpr (std::is_same_v<T, Date>) {
    writer.writeInt64(value.time_since_epoch().count(), number);
  } else if constexpr (std::is_same_v<T, std::string>) {
    writer.writeString(value, number);
  } else if constexpr (SharedRecordField<T>) {
    writer.writeSubmessage(*value, number);
  } else {
    const std::size_t begin = writer.beginMessage();
    if constexpr (SharedObjectField<T>) {
      writeFields(writer, WireObjectOf<T>::fields(*value));
    } else if constexpr (VectorField<T>) {
      writeMember(writer, 1, value);
    } else if constexpr (OptionalField<T>) {
      if (value) writeValue(writer, 1, *value);
    } else {
      writeFields(writer, value);
    }
    writer.endMessage(begin, number);
  }
}

template <class T>
void writeMember(ProtobufWriter& writer, std::uint32_t number, const T& member) {
  if (!fieldIsPresent(member)) return;
  if constexpr (ScalarField<T>) {
    writeValue(writer, number, member.value);
  } else if constexpr (SharedVectorField<T>) {
    writeMember(writer, number, *member);
  } else if constexpr (VectorField<T>) {
    for (auto element = member.rbegin(); element != member.rend(); ++element) writeValue(writer, number, *element);
  } else if constexpr (OptionalField<T>) {
    writeValue(writer, number, *member);
  } else {
    writeValue(writer, number, member);
  }
}

template <class Struct>
void writeFields(ProtobufWriter& writer, const Struct& record) {
  forEachFieldBackwards<Struct>([&](const auto& field) { writeMember(writer, field.number, record.*field.member); });
}

enum class FieldRead { done, failed, unknown };

/// Reads tags and has `readField(number)` read the fields that it knows, until the reader's length or an end of group.
template <class ReadField>
bool readTaggedFields(ProtobufReader& reader, ReadField readField) {
  while (reader.position() < reader.length()) {
    if (reader.hasError()) return false;
    const std::uint64_t tag = reader.readVarint();
    const auto wireType = static_cast<std::uint32_t>(tag & 7);
    if (reader.hasError() || wireType == kWireTypeEndGroup) return !reader.hasError();
    switch (readField(tag >> 3)) {
      case FieldRead::done:
        break;
      case FieldRead::failed:
        return false;
      case FieldRead::unknown:
        if (!reader.skipValueWithTag(static_cast<std::uint32_t>(tag >> 3), wireType)) return false;
    }
  }
  return !reader.hasError();
}

template <class Struct>
bool readFields(ProtobufReader& reader, Struct& record);

/// Reads a length and, limited to it, what `readContent` reads.
template <class ReadContent>
bool readMessage(ProtobufReader& reader, ReadContent readContent) {
  const auto mark = reader.placeMark();
  if (!mark || !readContent()) return false;
  reader.recallMark(*mark);
  return true;
}

template <class T>
bool readValue(ProtobufReader& reader, T& value) {
  if constexpr (std::is_same_v<T, bool>) {
    value = reader.readBool();
  } else if constexpr (std::is_same_v<T, double>) {
    value = reader.readDouble();
  } else if constexpr (NumberValue<T>) {
    value = static_cast<T>(reader.readVarint());
  } else if constexpr (std::is_same_v<T, Date>) {
    value = Date(Date::duration(reader.readInt64()));
  } else if constexpr (std::is_same_v<T, std::string>) {
    value = reader.readString().value_or(std::string_view());
  } else if constexpr (SharedRecordField<T>) {
    value = std::make_shared<typename T::element_type>();
    return readMessage(reader, [&] { return value->readFrom(reader); });
  } else if constexpr (SharedObjectField<T>) {
    return readMessage(reader, [&] {
      value = WireObjectOf<T>::make([&](auto& fields) { return readFields(reader, fields); });
      return value != nullptr;
    });
  } else if constexpr (VectorField<T> || OptionalField<T>) {
    return readMessage(reader, [&] {
      return readTaggedFields(reader, [&](std::uint64_t number) {
        if (number != 1) return FieldRead::unknown;
        return readMember(reader, value) ? FieldRead::done : FieldRead::failed;
      });
    });
  } else {
    return readMessage(reader, [&] { return readFields(reader, value); });
  }
  return !reader.hasError();
}

/// Reads one occurrence of a field.
template <class T>
bool readMember(ProtobufReader& reader, T& member) {
  if constexpr (ScalarField<T>) {
    member.isPresent = true;
    return readValue(reader, member.value);
  } else if constexpr (SharedVectorField<T>) {
    if (!member) member = std::make_shared<typename T::element_type>();
    return readMember(reader, *member);
  } else if constexpr (VectorField<T>) {
    if (readValue(reader, member.emplace_back())) return true;
    // A record that breaks off stays, with what was read of it.
    if constexpr (!SharedRecordField<ContentOfT<T>>) member.pop_back();
    return false;
  } else if constexpr (OptionalField<T>) {
    if constexpr (std::is_same_v<T, std::optional<std::string>>) {
      member.reset();
      if (const auto text = reader.readString()) member.emplace(*text);
      return member.has_value();
    } else {
      return readValue(reader, member.emplace());
    }
  } else {
    return readValue(reader, member);
  }
}

template <class Struct>
bool readFields(ProtobufReader& reader, Struct& record) {
  return readTaggedFields(reader, [&](std::uint64_t number) {
    auto outcome = FieldRead::unknown;
    const auto readIfIts = [&](const auto& field) {
      if (field.number != number) return false;
      outcome = readMember(reader, record.*field.member) ? FieldRead::done : FieldRead::failed;
      if (outcome == FieldRead::failed) reader.noteFailedField(field.name);
      return true;
    };
    std::apply([&](const auto&... field) { (readIfIts(field) || ...); }, RecordTable<Struct>::fields);
    return outcome;
  });
}

}  // namespace nimbo

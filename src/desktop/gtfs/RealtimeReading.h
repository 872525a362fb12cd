#pragma once

#include <protozero/pbf_message.hpp>
#include <string_view>

namespace nimbo {

// How GTFS-Realtime messages are gone through: fields of an unexpected wire type are passed over like unknown ones.

/// The present field as a text, bytes or a message; empty, and the field passed over, when it is of another wire type.
template <class Message>
std::string_view takeView(Message& message) {
  if (message.wire_type() != protozero::pbf_wire_type::length_delimited) {
    message.skip();
    return {};
  }
  const protozero::data_view view = message.get_view();
  return {view.data(), view.size()};
}

/// The present field as a number; 0, and the field passed over, when it is of another wire type.
template <class Message>
std::uint64_t takeNumber(Message& message) {
  if (message.wire_type() != protozero::pbf_wire_type::varint) {
    message.skip();
    return 0;
  }
  return message.get_uint64();
}

/// A reader of the message in these bytes by its field enumeration.
template <class Field>
protozero::pbf_message<Field> messageIn(std::string_view bytes) {
  return protozero::pbf_message<Field>(bytes.data(), bytes.size());
}

}  // namespace nimbo

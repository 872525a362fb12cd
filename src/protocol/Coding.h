#pragma once

#include <nlohmann/json.hpp>
#include <stdexcept>
#include <string>

namespace nimbo::protocol {

/// Something that is not as the protocol has it. The text names it, and what it must be: "\"row.frame\" must be ...".
struct Malformed : std::runtime_error {
  Malformed(std::string place, std::string expected);
  std::string place;     ///< keys from the outermost on, with dots between; empty: the message itself
  std::string expected;  ///< what stands there in a sound message
};

/// A message as JSON. For the messages of this folder; any other does not link.
template <class Message>
nlohmann::json write(const Message& message);

/// The message that JSON holds. Keys that are not known are passed over. Throws Malformed.
template <class Message>
Message read(const nlohmann::json& message);

}  // namespace nimbo::protocol

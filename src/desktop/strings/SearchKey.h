#pragma once

#include <string>
#include <string_view>

namespace nimbo {

/// `StringsPart::searchKey`; ICU is asked only for characters beyond ASCII, and where it is missing these stay as they
/// are. Any thread.
std::string searchKey(std::string_view text);

}  // namespace nimbo

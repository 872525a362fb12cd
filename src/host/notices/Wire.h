#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "host/notices/Bus.h"
#include "host/notices/Notice.h"
#include "host/notices/NoticeError.h"

namespace nimbo {

/// What programs say to nimbo-transit-notices: `Post(a(sssybs))` with key, title, body, urgency (0 to 2), silent and
/// opens of each notice; `Close(as)` with keys. Both answer with nothing, or with an error once it is known.
inline constexpr const char* kNoticesName = "org.nimbo.Transit.Notices";
inline constexpr const char* kNoticesObject = "/org/nimbo/Transit/Notices";
inline constexpr const char* kNoticesInterface = "org.nimbo.Transit.Notices";
inline constexpr const char* kNoticesSignature = "a(sssybs)";

void appendNotices(sd_bus_message* message, const std::vector<Notice>& notices);
/// Absent where the message holds something else, or more than `most`.
std::optional<std::vector<Notice>> readNotices(sd_bus_message* message, std::size_t most);

void appendKeys(sd_bus_message* message, const std::vector<std::string>& keys);
std::optional<std::vector<std::string>> readKeys(sd_bus_message* message, std::size_t most);

/// The name on the bus of an error of `NoticeError`.
std::string busNameOfError(const Error& error);
/// The code of an error by its name on the bus; absent for names of others.
std::optional<NoticeError> codeOfBusName(std::string_view name);

}  // namespace nimbo

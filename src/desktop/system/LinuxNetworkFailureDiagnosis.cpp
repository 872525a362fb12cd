#include "desktop/system/LinuxNetworkFailureDiagnosis.h"

#include <charconv>
#include <fstream>
#include <optional>
#include <sstream>
#include <string>
#include <system_error>
#include <vector>

namespace nimbo {

namespace {

namespace fs = std::filesystem;

/// The first line; empty where the file cannot be read.
std::string lineOf(const fs::path& file) {
  std::ifstream stream(file);
  std::string line;
  std::getline(stream, line);
  return line;
}

std::vector<fs::path> entriesOf(const fs::path& folder) {
  std::error_code ignored;
  std::vector<fs::path> entries;
  for (fs::directory_iterator entry(folder, ignored), end; entry != end; entry.increment(ignored))
    entries.push_back(entry->path());
  return entries;
}

bool allZeros(std::string_view digits) { return digits.find_first_not_of('0') == std::string_view::npos; }

/// RTF_UP without RTF_REJECT, of <linux/route.h>.
bool leadsSomewhere(const std::string& flags) {
  constexpr unsigned kUp = 0x0001, kReject = 0x0200;
  unsigned value = 0;
  std::from_chars(flags.data(), flags.data() + flags.size(), value, 16);
  return (value & kUp) && !(value & kReject);
}

/// Whether one line of a routing table is a default route; columns as in /proc/net/route and /proc/net/ipv6_route.
bool isDefaultRoute4(std::istringstream line) {
  std::string interface, destination, gateway, flags, references, use, metric, mask;
  return line >> interface >> destination >> gateway >> flags >> references >> use >> metric >> mask &&
         allZeros(destination) && allZeros(mask) && leadsSomewhere(flags);
}

bool isDefaultRoute6(std::istringstream line) {
  std::string destination, length, source, sourceLength, hop, metric, references, use, flags, interface;
  return line >> destination >> length >> source >> sourceLength >> hop >> metric >> references >> use >> flags >>
             interface &&
         allZeros(destination) && allZeros(length) && leadsSomewhere(flags) && interface != "lo";
}

/// Absent when the table cannot be read.
std::optional<bool> hasDefaultRoute(const fs::path& table, bool (*isDefault)(std::istringstream)) {
  std::ifstream stream(table);
  if (!stream) return std::nullopt;
  for (std::string line; std::getline(stream, line);)
    if (isDefault(std::istringstream(line))) return true;
  return false;
}

/// Whether there are radios, of `type` where one is given, and all of them are blocked.
bool everyRadioIsBlocked(const fs::path& sys, std::string_view type = {}) {
  bool exists = false;
  for (const fs::path& radio : entriesOf(sys / "class/rfkill")) {
    if (!type.empty() && lineOf(radio / "type") != type) continue;
    if (lineOf(radio / "soft") != "1" && lineOf(radio / "hard") != "1") return false;
    exists = true;
  }
  return exists;
}

bool isMobileBroadband(const fs::path& interface) {
  std::ifstream stream(interface / "uevent");
  for (std::string line; std::getline(stream, line);)
    if (line == "DEVTYPE=wwan") return true;
  return false;
}

bool mobileBroadbandIsOff(const fs::path& sys) {
  if (everyRadioIsBlocked(sys, "wwan")) return true;
  // A modem shows in class/wwan even while it has no network interface.
  bool exists = !entriesOf(sys / "class/wwan").empty();
  for (const fs::path& interface : entriesOf(sys / "class/net")) {
    if (!isMobileBroadband(interface)) continue;
    exists = true;
    const std::string state = lineOf(interface / "operstate");
    if (state == "up" || state == "unknown") return false;  // many modems never tell
  }
  return exists;
}

}  // namespace

NetworkFailure LinuxNetworkFailureDiagnosis::diagnose() const {
  const auto route4 = hasDefaultRoute(_root / "proc/net/route", isDefaultRoute4);
  const auto route6 = hasDefaultRoute(_root / "proc/net/ipv6_route", isDefaultRoute6);
  if (!route4 && !route6) return NetworkFailure::unknown;
  if (route4.value_or(false) || route6.value_or(false)) return NetworkFailure::unknown;
  if (everyRadioIsBlocked(_root / "sys")) return NetworkFailure::airplaneMode;
  if (mobileBroadbandIsOff(_root / "sys")) return NetworkFailure::cellularDataDisabled;
  return NetworkFailure::noInternet;
}

}  // namespace nimbo

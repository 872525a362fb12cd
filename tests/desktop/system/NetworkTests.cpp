#include <gtest/gtest.h>

#include "desktop/system/LinuxNetworkFailureDiagnosis.h"
#include "support/TemporaryFolder.h"

namespace nimbo {
namespace {

const std::string kRoutes4 = "Iface\tDestination\tGateway \tFlags\tRefCnt\tUse\tMetric\tMask\t\tMTU\tWindow\tIRTT\n";
const std::string kNearOnly = kRoutes4 + "eth0\t000200C0\t00000000\t0001\t0\t0\t0\t00FFFFFF\t0\t0\t0\n";
const std::string kDefault4 = kNearOnly + "eth0\t00000000\t010200C0\t0003\t0\t0\t0\t00000000\t0\t0\t0\n";
const std::string kRejected4 = kNearOnly + "*\t00000000\t00000000\t0201\t0\t0\t0\t00000000\t0\t0\t0\n";
const std::string kZeros(32, '0');
const std::string kDefault6 =
    kZeros + " 00 " + kZeros + " 00 fe800000000000000000000000000001 00000400 00000001 00000000 00000003     eth0\n";
const std::string kUnreachable6 =
    kZeros + " 00 " + kZeros + " 00 " + kZeros + " ffffffff 00000001 00000000 00200200       lo\n";

TEST(LinuxNetworkFailureDiagnosis, ReadsRadiosAndRoutes) {
  using enum NetworkFailure;
  using Files = std::map<std::string, std::string>;
  const Files kNoRoute{{"proc/net/route", kNearOnly}, {"proc/net/ipv6_route", kUnreachable6}};
  const auto noRouteAnd = [&](Files files) {
    files.insert(kNoRoute.begin(), kNoRoute.end());
    return files;
  };
  const auto radios = [](const char* firstSoft, const char* secondType, const char* secondHard) {
    const std::string first = "sys/class/rfkill/rfkill0/", second = "sys/class/rfkill/rfkill1/";
    return Files{{first + "type", "wlan\n"},    {first + "soft", firstSoft}, {first + "hard", "0\n"},
                 {second + "type", secondType}, {second + "soft", "0\n"},    {second + "hard", secondHard}};
  };
  const auto mobile = [](const char* state) {
    return Files{{"sys/class/net/eth0/operstate", "up\n"},
                 {"sys/class/net/wwan0/uevent", "DEVTYPE=wwan\nINTERFACE=wwan0\n"},
                 {"sys/class/net/wwan0/operstate", state}};
  };
  Files blockedWithRoute = radios("1\n", "bluetooth\n", "1\n");
  blockedWithRoute["proc/net/route"] = kDefault4;
  const std::tuple<const char*, Files, NetworkFailure> kCases[] = {
      {"nothing to read", {}, unknown},
      {"a route", {{"proc/net/route", kDefault4}}, unknown},
      {"a route of version 6 only",
       {{"proc/net/route", kRoutes4}, {"proc/net/ipv6_route", kUnreachable6 + kDefault6}},
       unknown},
      {"no route", kNoRoute, noInternet},
      {"an unreachable default", {{"proc/net/route", kRejected4}}, noInternet},
      {"a table cut off", {{"proc/net/route", "eth0\t00000000"}}, noInternet},
      {"all radios blocked", noRouteAnd(radios("1\n", "bluetooth\n", "1\n")), airplaneMode},
      {"all radios blocked, cable in", blockedWithRoute, unknown},
      {"one radio free", noRouteAnd(radios("1\n", "bluetooth\n", "0\n")), noInternet},
      {"mobile data down", noRouteAnd(mobile("down\n")), cellularDataDisabled},
      {"mobile data up", noRouteAnd(mobile("unknown\n")), noInternet},
      {"modem without an interface", noRouteAnd({{"sys/class/wwan/wwan0/uevent", ""}}), cellularDataDisabled},
      {"mobile radio blocked", noRouteAnd(radios("0\n", "wwan\n", "1\n")), cellularDataDisabled},
  };
  for (const auto& [name, files, expected] : kCases) {
    const TemporaryFolder root;
    for (const auto& [path, text] : files) root.write(path, text);
    EXPECT_EQ(LinuxNetworkFailureDiagnosis(root.path()).diagnose(), expected) << name;
  }
}

}  // namespace
}  // namespace nimbo

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iostream>
#include <iterator>

#include "desktop/rpc/Base64.h"
#include "desktop/store/RefreshSetting.h"
#include "host/Commands.h"
#include "host/HostPlatform.h"
#include "host/TerminalText.h"
#include "host/WidgetClient.h"
#include "host/telling/Teller.h"
#include "host/telling/TellingSettings.h"

namespace nimbo {

namespace {

std::string textOfSetting(const SharedSettingsStore::Value& value) {
  if (const bool* flag = std::get_if<bool>(&value)) return *flag ? "true" : "false";
  // Programs want the text that was stored.
  if (const std::string* text = std::get_if<std::string>(&value))
    return isatty(STDOUT_FILENO) ? printableText(*text) : *text;
  return base64(std::get<Bytes>(value));
}

SharedSettingsStore::Value settingOfText(const std::string& text) {
  if (text == "true" || text == "YES") return true;
  if (text == "false" || text == "NO") return false;
  return text;
}

std::string wordsOfAction(int action) {
  switch (action) {
    case kAnalyticsActionExpand:
      return "expand";
    case kAnalyticsActionCollapse:
      return "collapse";
    case kAnalyticsActionOpenItem:
      return "open a row of";
    default:
      return "action " + std::to_string(action) + " on";
  }
}

std::string textOfAction(const AnalyticsUserAction& action) {
  const std::string target =
      action.target == kAnalyticsTargetTransitWidget ? "the transit widget" : "target " + std::to_string(action.target);
  const std::string text = wordsOfAction(action.action) + " " + target;
  return action.value ? text + ", value " + printableText(*action.value) : text;
}

std::string wordsOfMessageType(int type) {
  switch (type) {
    case 0:
      return "nothing shown yet";
    case 1:
      return "no favorite lines";
    case 2:
      return "no incident";
    case 3:
      return "one incident";
    case 4:
      return "several incidents";
    default:
      return "message type " + std::to_string(type);
  }
}

std::string textOfInteraction(const AnalyticsWidgetInteraction& interaction) {
  const TransitWidgetAnalyticsRecord& record = interaction.record;
  std::string text = std::string("session, ended by ") +
                     (interaction.endState == 1 ? "opening a row" : "disappearing") + " after " +
                     std::to_string(static_cast<long>(interaction.duration)) + " s";
  if (interaction.wasLocked) text += ", locked";
  if (record.everExpanded) text += record.initiallyExpanded ? ", expanded from the start" : ", expanded";
  if (record.tappedItemIndex) text += ", row " + std::to_string(*record.tappedItemIndex);
  text += ", " + wordsOfMessageType(record.transitMessageType);
  for (const auto& item : record.incidentItems) {
    text += "\n  line " + item.transitLineMuid + ": " + printableText(item.transitIncidentTitle);
    if (item.count > 1) text += " (shown in " + std::to_string(item.count) + " reports)";
  }
  return text;
}

}  // namespace

int runSettingsGet(const CommandContext& context, const std::string& key) {
  HostPlatform platform(context);
  const auto value = Platform::current().sharedSettings().groupStore()->valueForKey(key);
  if (!value) throw CommandFailure("the setting " + key + " is not set");
  std::cout << textOfSetting(*value) << "\n";
  return kExitSuccess;
}

int runSettingsSet(const CommandContext& context, const std::string& key, const std::string& value) {
  if (key == kRefreshSecondsKey && !refreshSecondsIn(value))
    throw CommandFailure("the setting refreshSeconds is a whole number of seconds from 30 to 3600, and not \"" + value +
                         "\"");
  if (const std::string problem = problemOfTellingSetting(key, value); !problem.empty()) throw CommandFailure(problem);
  HostPlatform platform(context);
  if (key == kNotifyKey)
    require(setNotify(*platform.operator->(), value));
  else
    require(Platform::current().sharedSettings().groupStore()->setValue_forKey(settingOfText(value), key));
  return kExitSuccess;
}

int runSettingsUnset(const CommandContext& context, const std::string& key) {
  HostPlatform platform(context);
  require(Platform::current().sharedSettings().groupStore()->removeValueForKey(key));
  return kExitSuccess;
}

int runAnalytics(const CommandContext& context, bool json) {
  HostPlatform platform(context);
  const auto entries = platform->analytics().list();
  require(entries.error());
  for (const AnalyticsEntry& entry : *entries) {
    if (json) {
      std::cout << printableJSON(jsonOfAnalyticsEntry(entry)) << "\n";
      continue;
    }
    std::cout << isoTextOfDate(entry.date) << "  ";
    if (const auto* action = std::get_if<AnalyticsUserAction>(&entry.content))
      std::cout << textOfAction(*action);
    else
      std::cout << textOfInteraction(std::get<AnalyticsWidgetInteraction>(entry.content));
    std::cout << "\n";
  }
  return kExitSuccess;
}

int runDecode(const CommandContext& context, const std::string& file) {
  std::ifstream opened;
  if (file != "-") {
    opened.open(file, std::ios::binary);
    if (!opened) throw CommandFailure("cannot read " + file + ": " + std::strerror(errno));
  }
  std::istream& input = file == "-" ? std::cin : opened;
  const Bytes bytes{std::istreambuf_iterator<char>(input), std::istreambuf_iterator<char>()};
  if (input.bad() || std::ferror(stdin)) throw CommandFailure("cannot read " + file + ": " + std::strerror(errno));
  WidgetClient client(context.runLoop, context.widgetArguments);
  try {
    std::cout << printableJSON(client.call(protocol::kDecode, {base64(bytes)}).text) << "\n";
  } catch (const WidgetRefusal& refusal) {
    throw CommandFailure(file + ": " + refusal.error.message);
  }
  return kExitSuccess;
}

}  // namespace nimbo

// nimbo-transit: the widget in a terminal, and what it needs set up.

#include <poll.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <set>

#include "desktop/gtfs/feeds/Feed.h"
#include "desktop/system/SmallMemory.h"
#include "desktop/system/StandardDescriptors.h"
#include "host/Arguments.h"
#include "host/Commands.h"
#include "host/StatusBar.h"
#include "platform/foundation/Version.h"

namespace nimbo {
namespace {

/// The command line's words. What the user chose is called once everything is parsed.
class CommandLine {
 public:
  CommandLine();
  int run(int argc, char** argv);

 private:
  using Action = std::function<int(const CommandContext&)>;
  CLI::App* add(CLI::App& parent, const std::string& name, const std::string& description, Action action);
  /// Prints a message on standard error, unless it was printed before.
  void say(const std::string& message);
  /// The exit status for what was printed, which may not have been written: says so then.
  int outputStatus();
  void addWidgetCommands();
  /// What `feed add` and `feed edit` have in common; answers the options of the two addresses.
  std::pair<CLI::Option*, CLI::Option*> addFeedOptions(CLI::App& command);
  void addFeedCommands();
  void addFavoriteCommands();
  void addStateCommands();

  CLI::App _app{"How your transit lines run: shows their incidents, and sets up feeds and favorite lines."};
  std::optional<std::filesystem::path> _config, _state;
  Action _chosen;

  StatusOptions _status;
  RenderOptions _render;
  FeedOptions _feed;
  std::optional<std::string> _virtualTime;
  std::string _file, _text, _key, _value;
  std::vector<std::string> _lines;
  bool _json = false, _watch = false, _notify = false;
  std::set<std::string> _said;
};

CommandLine::CommandLine() {
  _app.require_subcommand(1);
  _app.set_version_flag("--version", kVersion);
  _app.add_option("--config", _config, "Folder of feeds.json (default: $XDG_CONFIG_HOME/nimbo-transit)")
      ->check(checkFolder);
  _app.add_option("--state", _state, "Folder of favorites and last rows (default: $XDG_STATE_HOME/nimbo-transit)")
      ->check(checkFolder);
  _app.fallthrough();
  addWidgetCommands();
  addFeedCommands();
  addFavoriteCommands();
  addStateCommands();
}

CLI::App* CommandLine::add(CLI::App& parent, const std::string& name, const std::string& description, Action action) {
  CLI::App* command = parent.add_subcommand(name, description);
  command->callback([this, action = std::move(action)] { _chosen = action; });
  return command;
}

void CommandLine::addWidgetCommands() {
  CLI::App* status = _app.add_subcommand("status", "Show how the favorite lines run");
  CLI::Option* expanded =
      status->add_flag("--expanded", _status.expanded, "One row for each incident instead of one for all");
  CLI::Option* json = status->add_flag("--json", _status.json, "The widget's snapshot as JSON");
  CLI::Option* now =
      status->add_option("--now", _status.now, "ISO date by which incidents are judged")->check(checkDate);
  CLI::Option* waybar = status->add_flag_callback(
      "--waybar", [this] { _status.format = "waybar"; }, "Short for --format waybar");
  CLI::Option* lines = status->add_flag("--lines", _status.lines, "Each favorite line with its state");
  CLI::Option* planned =
      status->add_flag("--planned", _status.planned, "What is to come within seven days, by line and day");
  CLI::Option* saved =
      status->add_flag("--saved", _status.saved, "The rows of the last time with their date, without a fetch");
  CLI::Option* format = status
                            ->add_option("--format", _status.format,
                                         "text; json: the state of each favorite line; or for a status bar waybar, "
                                         "i3bar, or line: plain text")
                            ->check(CLI::IsMember({"text", "json", "waybar", "i3bar", "line"}));
  CLI::Option* exitCode = status->add_flag("--exit-code", _status.exitCode,
                                           "Exit with 0 for good service, 3 affected, 4 unknown, 5 no favorites");
  for (CLI::Option* bars : {waybar, format})
    for (CLI::Option* other : {expanded, json, lines, planned}) bars->excludes(other);
  waybar->excludes(format)->excludes(exitCode);
  lines->excludes(planned);
  for (CLI::Option* other : {expanded, json, saved}) {
    lines->excludes(other);
    planned->excludes(other);
  }
  saved->excludes(exitCode);
  CLI::Option* watch = status->add_flag("--watch", _watch, "Go on printing a line whenever it changes");
  watch->excludes(now)->excludes(saved);
  status->add_flag("--notify", _notify, "Have the desktop tell of incidents that begin, get worse and end")
      ->needs(watch);
  status->callback([this, saved, exitCode] {
    const BarFormat* bar = barFormatNamed(_status.format);
    if (_watch && !bar) throw CLI::RequiresError("--watch", "--format waybar, i3bar or line");
    if (bar && *exitCode) throw CLI::ExcludesError("--format " + _status.format, "--exit-code");
    if (_status.format == "json" && *saved) throw CLI::ExcludesError("--format json", "--saved");
    _chosen = [this, bar](const CommandContext& context) {
      if (!bar) return runStatus(context, _status);
      return _watch ? runStatusWatch(context, *bar, _notify) : runStatusBar(context, *bar, _status);
    };
  });

  add(_app, "update", "Fetch, and keep the rows for the widget's next start", [this](const CommandContext& context) {
    return runUpdate(context, _notify);
  })->add_flag("--notify", _notify, "Have the desktop tell of incidents that begin, get worse and end");

  CLI::App* render = add(_app, "render", "Draw the rows into a PNG file", [this](const CommandContext& context) {
    _render.size = sizeOfArgument(_text);
    return runRender(context, _render);
  });
  render->add_flag("--expanded", _render.expanded, "One row for each incident instead of one for all");
  render->add_option("--size", _text, "Most room in points, as WIDTHxHEIGHT; grows with the text size until set")
      ->check(checkSize);
  render->add_option("--scale", _render.scale, "Device pixels for each point, 0.25 to 8")
      ->capture_default_str()
      ->check(checkScale);
  render->add_option("--text-size", _render.textSize, "extraSmall to accessibilityExtraExtraExtraLarge")
      ->capture_default_str()
      ->check(checkTextSize);
  render->add_flag("--dark", _render.dark, "In the dark appearance");
  render->add_option("--locale", _render.locale, "Language of the texts, such as de or ar-EG");
  render->add_option("--now", _render.now, "ISO date by which incidents are judged")->check(checkDate);
  render->add_option("OUT", _render.output, "PNG file to write")->required()->check(checkPicture);

  CLI::App* script = add(_app, "script", "Play a file of host events to a widget process and print what comes back",
                         [this](const CommandContext& context) { return runScript(context, _file, _virtualTime); });
  script->add_option("FILE", _file, "JSON-RPC messages, one a line; - for the standard input")->required();
  script->add_option("--virtual-time", _virtualTime, "ISO date at which the widget's time stands still")
      ->check(checkDate);
}

std::pair<CLI::Option*, CLI::Option*> CommandLine::addFeedOptions(CLI::App& command) {
  const auto addAddress = [&](const char* option, std::optional<std::string>& address, const char* description) {
    return command.add_option(option, address, description)->check(checkFeedAddress);
  };
  const auto addHeaders = [&](const char* option, std::vector<std::string>& headers, const char* description) {
    command.add_option(option, headers, description)->type_name("'NAME: VALUE'")->expected(1)->take_all();
  };
  CLI::Option* staticFeed =
      addAddress("--static", _feed.staticFeed, "GTFS: a folder, a zip file, or an http(s) address");
  CLI::Option* alerts =
      addAddress("--alerts", _feed.alerts, "GTFS-Realtime Service Alerts: a file or an http(s) address");
  addAddress("--mirror", _feed.mirror, "Address of a copy, read where the static feed cannot be fetched");
  CLI::Option* key = command.add_option("--key", _feed.key, "The key that the agency gave you");
  command.add_option("--key-file", _feed.keyFile, "File that holds the key; - for the standard input")->excludes(key);
  addHeaders("--header", _feed.headers, "Sent to both servers; may be given again");
  addHeaders("--static-header", _feed.staticHeaders, "Sent to the server of the static feed");
  addHeaders("--alerts-header", _feed.alertsHeaders, "Sent to the server of the alerts");
  command.add_flag("--combined,!--no-combined", _feed.isCombined,
                   "The alerts come beside positions of vehicles or times of trips");
  command.add_flag("--minor-alerts,!--no-minor-alerts", _feed.minorAlerts,
                   "Alerts count too that change nothing for most riders");
  command.add_option("--maximum-age", _feed.maximumAlertsAgeMinutes, "Minutes for which alerts count")
      ->check(CLI::Range(0, kLongestAlertsAgeMinutes));
  command.add_flag("--force", _feed.force, "Keep what cannot be used now");
  return {staticFeed, alerts};
}

void CommandLine::addFeedCommands() {
  CLI::App* feed = _app.add_subcommand("feed", "The feeds of the agencies")->require_subcommand(1);
  CLI::App* find = add(*feed, "find", "Find an agency's feed by agency or place",
                       [this](const CommandContext& context) { return runFeedFind(context, _text, _json); });
  find->add_option("TEXT", _text, "Words of the agency, the place or the country, in any order")->required();
  find->add_flag("--json", _json, "As JSON");
  CLI::App* addFeed =
      add(*feed, "add", "Set up a feed", [this](const CommandContext& context) { return runFeedAdd(context, _feed); });
  CLI::Option* name = addFeed->add_option("NAME", _feed.name, "Name of your choice; a fitting one is made with --from");
  name->check(checkFeedName);
  CLI::Option* from = addFeed->add_option("--from", _feed.from, "A feed that \"feed find\" tells, by its ID");
  const auto addresses = addFeedOptions(*addFeed);
  // Either from the catalog, or by name and addresses.
  addFeed->callback([this, name, from, addresses] {
    for (const CLI::Option* option : {name, addresses.first, addresses.second})
      if (from->count() == 0 && option->count() == 0) throw CLI::RequiredError(option->get_name() + " or --from");
    _chosen = [this](const CommandContext& context) { return runFeedAdd(context, _feed); };
  });
  from->excludes(addresses.first)->excludes(addresses.second);
  for (const char* option : {"--mirror", "--header", "--static-header", "--alerts-header"})
    from->excludes(addFeed->get_option(option));
  CLI::App* edit = add(*feed, "edit", "Change a feed: what is given, and its name stays",
                       [this](const CommandContext& context) { return runFeedEdit(context, _feed); });
  edit->add_option("NAME", _feed.name, "Name of the feed")->required();
  addFeedOptions(*edit);
  edit->add_flag("--no-keys", _feed.withoutKeys, "Forget the keys that are kept for it");
  CLI::App* remove = add(*feed, "remove", "Forget a feed",
                         [this](const CommandContext& context) { return runFeedRemove(context, _feed.name); });
  remove->add_option("NAME", _feed.name, "Name of the feed")->required();
  add(*feed, "list", "List the feeds", [this](const CommandContext& context) {
    return runFeedList(context, _json);
  })->add_flag("--json", _json, "As JSON");
  CLI::App* check = add(*feed, "check", "Read feeds and count what they hold, and what fits nothing",
                        [this](const CommandContext& context) { return runFeedCheck(context, _feed.name); });
  check->add_option("NAME", _feed.name, "Name of the feed; all without one");

  CLI::App* lines = add(_app, "lines", "List the lines of all feeds",
                        [this](const CommandContext& context) { return runLines(context, _text, _json); });
  lines->add_flag("--json", _json, "As JSON");
  lines->add_option("TEXT", _text, "Only lines with these words in name, agency or identifier, the nearest first");
}

void CommandLine::addFavoriteCommands() {
  CLI::App* favorite = _app.add_subcommand("favorite", "Your favorite lines")->require_subcommand(1);
  CLI::App* addLines = add(*favorite, "add", "Add lines",
                           [this](const CommandContext& context) { return runFavoriteAdd(context, _lines); });
  addLines->add_option("FEED:ROUTE_ID", _lines, "Lines as \"lines\" prints them")->required()->check(checkLineName);
  CLI::App* remove = add(*favorite, "remove", "Remove lines",
                         [this](const CommandContext& context) { return runFavoriteRemove(context, _lines); });
  remove->add_option("FEED:ROUTE_ID", _lines, "Lines as \"favorite list\" prints them")->required();
  CLI::App* move = add(*favorite, "move", "Move a line to another position", [this](const CommandContext& context) {
    return runFavoriteMove(context, _text, *positionOfArgument(_value));
  });
  move->add_option("FEED:ROUTE_ID", _text, "A line as \"favorite list\" prints it")->required();
  move->add_option("POSITION", _value, "1 is the first")->required()->check(checkPosition);
  add(*favorite, "list", "List the favorite lines in their order", [this](const CommandContext& context) {
    return runFavoriteList(context, _json);
  })->add_flag("--json", _json, "As JSON");
}

void CommandLine::addStateCommands() {
  CLI::App* settings = _app.add_subcommand("settings", "Settings that widget and hosts share")->require_subcommand(1);
  CLI::App* get = add(*settings, "get", "Print a setting",
                      [this](const CommandContext& context) { return runSettingsGet(context, _key); });
  CLI::App* set = add(*settings, "set", "Store a setting: true, false, a number or a text",
                      [this](const CommandContext& context) { return runSettingsSet(context, _key, _value); });
  CLI::App* unset = add(*settings, "unset", "Remove a setting",
                        [this](const CommandContext& context) { return runSettingsUnset(context, _key); });
  for (CLI::App* command : {get, set, unset}) command->add_option("KEY", _key, "Name of the setting")->required();
  set->add_option("VALUE", _value, "true, false, a number or a text")->required();

  CLI::App* analytics = add(_app, "analytics", "Show the usage records that are kept, and never sent anywhere",
                            [this](const CommandContext& context) { return runAnalytics(context, _json); });
  analytics->add_flag("--json", _json, "One JSON object a line");
  CLI::App* decode = add(_app, "decode", "Print a hand-off payload or a saved state as JSON",
                         [this](const CommandContext& context) { return runDecode(context, _file); });
  decode->add_option("FILE", _file, "File with the bytes; - for the standard input")->required();
}

int CommandLine::run(int argc, char** argv) {
  try {
    _app.parse(argc, argv);
  } catch (const CLI::ParseError& error) {
    if (error.get_exit_code() != 0) {
      say(problemOfArguments(_app, error));
      return kExitUsage;
    }
    _app.exit(error);  // prints the help or the version
    return outputStatus();
  }
  int status = kExitSuccess;
  // A command without notices of its own has failed all the same when there is one.
  const auto tell = [&](const std::string& notice) {
    say(notice);
    status = kExitFailure;
  };
  try {
    std::vector<std::string> arguments;
    if (_config) arguments.insert(arguments.end(), {"--config", std::filesystem::absolute(*_config)});
    if (_state) arguments.insert(arguments.end(), {"--state", std::filesystem::absolute(*_state)});
    GLibRunLoop runLoop;
    status = std::max(_chosen({runLoop, Paths::resolve(_config, _state), std::move(arguments), tell}), status);
  } catch (const std::exception& failure) {
    say(failure.what());
    status = kExitFailure;
  }
  return std::max(outputStatus(), status);
}

void CommandLine::say(const std::string& message) {
  if (_said.insert(message).second) printMessage(message);
}

int CommandLine::outputStatus() {
  errno = 0;
  if (std::cout.flush() && !std::ferror(stdout)) return kExitSuccess;
  const int failure = errno;  // 0 where an earlier write has failed
  // Who closes his end of a pipe has read enough.
  pollfd output{STDOUT_FILENO, 0, 0};
  if (poll(&output, 1, 0) == 1 && (output.revents & (POLLERR | POLLHUP))) return kExitSuccess;
  say("cannot write to the standard output" + (failure ? std::string(": ") + std::strerror(failure) : ""));
  return kExitFailure;
}

}  // namespace
}  // namespace nimbo

int main(int argc, char** argv) {
  nimbo::keepHeapSmall();
  nimbo::prepareStandardDescriptors();
  return nimbo::CommandLine().run(argc, argv);
}

#include "host/Programs.h"

#include <cstdlib>
#include <regex>
#include <sstream>
#include <stdexcept>

namespace nimbo {

using nlohmann::json;

Programs::Programs() {
  folder.write("feed/agency.txt",
               "agency_id,agency_name,agency_url,agency_timezone\n"
               "M,Metro,https://example.org,UTC\nB,Buses,https://example.org,UTC\n");
  folder.write("feed/routes.txt",
               "route_id,agency_id,route_short_name,route_long_name,route_type,route_color,route_text_color\n"
               "m1,M,1,Harbour Line,1,005599,FFFFFF\nm2,M,2,Castle Line,1,CC0000,FFFFFF\n"
               "b10,B,10,Market,3,,\nb11,B,11,Airport,3,,\nb12,B,12,Beach,3,,\n");
  publish({});
}

void Programs::publish(const std::vector<AlertsBuilder::Alert>& alerts) const {
  publishBytes(AlertsBuilder::feed(now(), alerts));
}

void Programs::setUpCity(const std::vector<std::string>& favorites,
                         const std::vector<AlertsBuilder::Alert>& alerts) const {
  publish(alerts);
  run({"feed", "add", "city", "--static", folder.path() / "feed", "--alerts", alertsFile(), "--force"});
  // Its alerts are of the virtual date, whatever the date of a program is.
  auto feeds = nlohmann::json::parse(folder.read("config/feeds.json"));
  for (auto& feed : feeds["feeds"]) feed["maximumAlertsAgeMinutes"] = 0;
  folder.write("config/feeds.json", feeds.dump());
  std::vector<std::string> add = {"favorite", "add"};
  for (const std::string& route : favorites) add.push_back("city:" + route);
  if (!favorites.empty()) run(add);
}

ProgramRun Programs::run(const std::vector<std::string>& arguments, const std::string& input,
                         const std::string& output) const {
  folder.write("stdin", input);
  folder.write("stdout", "");
  const std::string top = folder.path().string() + "/";
  std::string command = "exec '" NIMBO_TRANSIT "' --config " + top + "config --state " + top + "state";
  for (const std::string& argument : arguments)
    command += " '" + std::regex_replace(argument, std::regex("'"), "'\\''") + "'";
  command += " <" + top + "stdin 2>" + top + "stderr >" + (output.empty() ? top + "stdout" : output);
  const int status = std::system(command.c_str());
  return {WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status), folder.read("stdout"),
          folder.read("stderr")};
}

std::vector<json> Programs::play(const std::vector<json>& events) const {
  std::string script;
  for (const json& event : events) script += (event.is_string() ? event.get<std::string>() : event.dump()) + "\n";
  const ProgramRun result = run({"script", "--virtual-time", isoTextOfDate(now()), "-"}, script);
  if (result.status != 0) throw std::runtime_error("script failed: " + result.errors + result.output);
  std::vector<json> lines;
  std::istringstream output(result.output);
  for (std::string line; std::getline(output, line);) lines.push_back(json::parse(line));
  return lines;
}

json request(const std::string& method, json params) {
  static int identifier = 0;
  return {{"jsonrpc", "2.0"}, {"id", ++identifier}, {"method", method}, {"params", std::move(params)}};
}

std::vector<json> appearing(double compactHeight, double expandedHeight) {
  return {
      request("initialize", {{"locale", "en"},
                             {"displayModes", {{"compact", {359, compactHeight}}, {"expanded", {359, expandedHeight}}}},
                             {"bundle", {{"kind", "application"}, {"identifier", "org.example.Host"}}}}),
      request("loadView"), request("viewWillAppear"), request("viewDidAppear")};
}

std::vector<json> snapshots(const std::vector<json>& lines) {
  std::vector<json> found;
  for (const json& line : lines)
    if (line.contains("result") && line["result"].is_object() && line["result"].contains("rows"))
      found.push_back(line["result"]);
  return found;
}

std::vector<std::string> titles(const json& snapshot) {
  std::vector<std::string> texts;
  for (const json& row : snapshot.at("rows")) texts.push_back(row.value("primaryText", "(none)"));
  return texts;
}

}  // namespace nimbo

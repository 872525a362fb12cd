#include "host/Arguments.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cstdint>
#include <filesystem>
#include <vector>

#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "platform/foundation/Date.h"
#include "protocol/Names.h"

namespace nimbo {

namespace {

std::string inQuotes(const std::string& text) { return "\"" + text + "\""; }

/// The number that the whole text is. Unlike stream operators, from_chars takes neither blanks nor hexadecimal numbers.
template <class Number>
std::optional<Number> numberOf(std::string_view text, Number least, Number greatest) {
  Number number{};
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  const bool isWhole = error == std::errc() && end == text.data() + text.size();
  return isWhole && number >= least && number <= greatest ? std::optional(number) : std::nullopt;
}

std::string reasonOf(const ErrorRef& error) { return error ? error->reason() : std::string(); }

/// How many letters must be put in, taken out, replaced or exchanged with their neighbour to make one word the other.
std::size_t distanceBetween(std::string_view one, std::string_view other) {
  std::vector<std::vector<std::size_t>> rows(one.size() + 1, std::vector<std::size_t>(other.size() + 1));
  for (std::size_t i = 0; i <= one.size(); ++i) {
    for (std::size_t j = 0; j <= other.size(); ++j) {
      if (i == 0 || j == 0) {
        rows[i][j] = i + j;
        continue;
      }
      const std::size_t replaced = rows[i - 1][j - 1] + (one[i - 1] == other[j - 1] ? 0 : 1);
      rows[i][j] = std::min({rows[i - 1][j] + 1, rows[i][j - 1] + 1, replaced});
      if (i > 1 && j > 1 && one[i - 1] == other[j - 2] && one[i - 2] == other[j - 1])
        rows[i][j] = std::min(rows[i][j], rows[i - 2][j - 2] + 1);
    }
  }
  return rows[one.size()][other.size()];
}

/// The word that was probably meant; empty when none is near.
std::string nearestOf(const std::vector<std::string>& words, const std::string& written) {
  constexpr std::size_t kLongest = 64;
  if (written.size() > kLongest) return {};
  std::string nearest;
  std::size_t least = written.size() / 4 + 2;
  for (const std::string& word : words) {
    // One that is written in part is nearer than any with a fault.
    const std::size_t distance = written.size() > 1 && word.starts_with(written) ? 0 : distanceBetween(written, word);
    if (distance >= least) continue;
    least = distance;
    nearest = word;
  }
  return nearest;
}

std::string listOf(const std::vector<std::string>& words) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : ", ") + word;
  return text;
}

std::vector<std::string> commandsOf(const CLI::App& app) {
  std::vector<std::string> names;
  for (const CLI::App* command : app.get_subcommands([](const CLI::App*) { return true; }))
    names.push_back(command->get_name());
  return names;
}

std::vector<std::string> optionsOf(const CLI::App& app) {
  std::vector<std::string> names;
  for (const CLI::Option* option : app.get_options())
    for (const std::string& name : option->get_lnames()) names.push_back("--" + name);
  return names;
}

bool isOption(const std::string& word) { return word.size() > 1 && word.front() == '-'; }

/// What is wrong with an option that `command` does not have.
std::string problemOfOption(const CLI::App& app, const CLI::App& command, std::string word) {
  word.resize(std::min(word.find('='), word.size()));
  std::vector<std::string> options = optionsOf(command);
  for (const std::string& name : optionsOf(app)) options.push_back(name);
  const std::string nearest = nearestOf(options, word);
  return "there is no option " + inQuotes(word) +
         (nearest.empty() ? std::string() : ". Did you mean " + inQuotes(nearest) + "?");
}

}  // namespace

std::string checkDate(const std::string& text) {
  return dateFromISOText(text) ? "" : inQuotes(text) + " is no ISO date such as 2026-01-05T12:00:00Z";
}

std::string checkSize(const std::string& text) {
  return sizeOfArgument(text) ? "" : inQuotes(text) + " is no size such as 359x110, each side 1 to 100000 points";
}

std::string checkScale(const std::string& text) {
  return numberOf(text, 0.25, 8.0) ? "" : inQuotes(text) + " is no number from 0.25 to 8";
}

std::string checkTextSize(const std::string& text) {
  return protocol::named<ContentSizeCategory>(text)
             ? ""
             : inQuotes(text) + " is no text size from extraSmall to accessibilityExtraExtraExtraLarge";
}

std::string checkPicture(const std::string& text) {
  if (text.empty()) return "the name of the file is empty";
  std::string ending = std::filesystem::path(text).extension();
  for (char& c : ending) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
  return ending.empty() || ending == ".png" ? ""
                                            : inQuotes(text) + " is written as PNG alone: let its name end in .png";
}

std::string checkPosition(const std::string& text) {
  return positionOfArgument(text) ? "" : inQuotes(text) + " is no position: they count from 1";
}

std::string checkLineName(const std::string& text) {
  return text.find(':') != std::string::npos
             ? ""
             : inQuotes(text) + " is no line: write the feed, a colon and the route, as \"lines\" prints them";
}

std::string checkFeedName(const std::string& text) { return reasonOf(FeedConfiguration::checkName(text)); }

std::string checkFeedAddress(const std::string& text) { return reasonOf(FeedAddress::parse(text).error()); }

std::string checkFolder(const std::string& text) { return text.empty() ? "the name of the folder is empty" : ""; }

std::optional<Size> sizeOfArgument(const std::string& text) {
  constexpr double kLeast = 1, kGreatest = 100000;
  const std::size_t cross = std::min(text.find('x'), text.size());
  const auto width = numberOf(std::string_view(text).substr(0, cross), kLeast, kGreatest);
  const auto height = numberOf(std::string_view(text).substr(std::min(cross + 1, text.size())), kLeast, kGreatest);
  return width && height ? std::optional(Size{*width, *height}) : std::nullopt;
}

std::optional<int> positionOfArgument(const std::string& text) { return numberOf(text, 1, INT32_MAX); }

std::string problemOfArguments(const CLI::App& app, const CLI::ParseError& refusal) {
  const CLI::App* command = &app;
  std::string path;
  while (!command->get_subcommands().empty()) {
    command = command->get_subcommands().front();
    path += command->get_name() + " ";
  }
  const std::vector<std::string> commands = commandsOf(*command);
  std::vector<std::string> extras = app.remaining(true);
  std::erase(extras, "--");

  const bool isAboutExtras =
      dynamic_cast<const CLI::RequiredError*>(&refusal) || dynamic_cast<const CLI::ExtrasError*>(&refusal);
  std::string problem = refusal.what();
  if (isAboutExtras && !commands.empty()) {
    const auto written = std::find_if_not(extras.begin(), extras.end(), isOption);
    const std::string nearest = written == extras.end() ? "" : nearestOf(commands, *written);
    problem = written == extras.end() ? "a command is missing" : "there is no command " + inQuotes(path + *written);
    problem +=
        nearest.empty() ? ". The commands are " + listOf(commands) : ". Did you mean " + inQuotes(path + nearest) + "?";
  } else if (isAboutExtras && !extras.empty()) {
    const std::string& first = extras.front();
    problem = isOption(first)
                  ? problemOfOption(app, *command, first)
                  : inQuotes(first) + " is more than " + inQuotes(path.substr(0, path.size() - 1)) + " takes";
  }
  if (!problem.ends_with('.') && !problem.ends_with('?')) problem += ".";
  return problem + " See \"nimbo-transit " + path + "--help\".";
}

}  // namespace nimbo

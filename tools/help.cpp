// SPDX-License-Identifier: MIT

#include "help.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <memory>
#include <sstream>
#include <vector>

#include "vector/cpuLevel.h"
#include "names.h"
#include "rasterVersion.h"

namespace tool {
namespace {

constexpr size_t kWidth = 80;
constexpr size_t kColumn = 26;  // where descriptions begin

/// Words of a text in lines from column `indent` on; the first line begins at column `at`.
std::string wrapped(const std::string& text, size_t indent, size_t at) {
  std::istringstream words(text);
  std::string result;
  for (std::string word; words >> word;) {
    const bool isFirst = result.empty();
    if (!isFirst && at + 1 + word.size() > kWidth) {
      result += "\n" + std::string(indent, ' ');
      at = indent;
    } else if (!isFirst) {
      result += ' ';
      ++at;
    }
    result += word;
    at += word.size();
  }
  return result + "\n";
}

std::string paragraph(const std::string& text) { return wrapped(text, 0, 0); }

/// A name with its description beside it, or below it where the name is long.
std::string entry(const std::string& name, const std::string& description) {
  std::string line = "  " + name;
  if (line.size() + 2 > kColumn) {
    line += "\n" + std::string(kColumn, ' ');
  } else {
    line.resize(kColumn, ' ');
  }
  return line + wrapped(description, kColumn, kColumn);
}

std::string replaced(std::string text, const std::string& what, const std::string& by) {
  for (size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + by.size()))
    text.replace(at, what.size(), by);
  return text;
}

/// What an option takes: "TEXT:{png,bmp}" becomes "png|bmp", "COUNT in [0 - 9]" becomes a form and
/// a remark.
struct Value {
  std::string form;
  std::string remark;
};

Value valueOf(const CLI::Option* option) {
  if (option->get_expected_min() == 0 || option->get_type_size() == 0) return {};
  const std::string type = option->get_type_name();
  const size_t colon = type.find(':');
  std::string form = type.substr(0, colon);
  std::string check = colon == std::string::npos ? "" : type.substr(colon + 1);
  if (form == "TEXT" || form == "UINT" || form == "INT" || form == "FLOAT") form = "VALUE";
  const size_t listEnd = check.find('}');
  if (check.rfind('{', 0) == 0 && listEnd != std::string::npos)
    return {replaced(check.substr(1, listEnd - 1), ",", "|"), ""};
  const size_t range = check.find(" in [");
  const bool hasEnd = check.size() < 4 || check.substr(check.size() - 4) != " - ]";
  if (range != std::string::npos && !hasEnd) return {check.substr(0, range), ""};
  if (range == std::string::npos) return {form, ""};
  return {check.substr(0, range), check.substr(range + 5, check.size() - range - 6)};
}

std::string describedOption(const CLI::Option* option) {
  const bool isArgument = option->get_positional();
  const Value value = valueOf(option);
  std::string name = replaced(option->get_name(isArgument, !isArgument), ",", ", ");
  if (!isArgument && !value.form.empty()) name += " " + value.form;
  std::string description = option->get_description();
  if (!value.remark.empty()) description += " (" + value.remark + ")";
  if (!option->get_default_str().empty())
    description += " (default: " + option->get_default_str() + ")";
  if (!isArgument && option->get_required()) description += " (required)";
  return entry(name, description);
}

std::string section(const std::string& title, const std::vector<const CLI::Option*>& options) {
  std::string text;
  for (const CLI::Option* option : options) text += describedOption(option);
  return text.empty() ? text : "\n" + title + "\n" + text;
}

std::vector<const CLI::App*> named(const CLI::App* app, bool isNamed) {
  return app->get_subcommands(
      [&](const CLI::App* each) { return each->get_name().empty() != isNamed; });
}

std::string usage(const CLI::App* app, const std::vector<const CLI::Option*>& arguments) {
  const std::string name =
      app->get_parent() == nullptr ? "rastertool" : "rastertool " + app->get_name();
  std::string line = "Usage: " + name;
  line += app->get_parent() == nullptr ? " COMMAND [ARGUMENT...]" : " [OPTION...]";
  for (const CLI::Option* argument : arguments) {
    std::string word = argument->get_name(true, false);
    if (argument->get_expected_max() > 1) word += "...";
    line += " " + (argument->get_required() ? word : "[" + word + "]");
  }
  return wrapped(line, std::string("Usage: ").size(), 0);
}

class Formatter : public CLI::FormatterBase {
 public:
  std::string make_help(const CLI::App* app, std::string /*name*/,
                        CLI::AppFormatMode /*mode*/) const override {
    const auto arguments =
        app->get_options([](const CLI::Option* option) { return option->get_positional(); });
    const auto options = app->get_options([](const CLI::Option* option) {
      return option->nonpositional() && !option->get_group().empty();
    });
    std::string text = usage(app, arguments) + "\n" + paragraph(app->get_description());
    if (!named(app, true).empty()) text += "\nCommands:\n";
    for (const CLI::App* command : named(app, true))
      text += entry(command->get_name(), firstSentence(command->get_description()));
    text += section("Arguments:", arguments);
    for (const CLI::App* group : named(app, false))
      text += section(group->get_description() + ":", group->get_options());
    text += section("Options:", options);
    std::istringstream notes(app->get_footer());
    for (std::string line; std::getline(notes, line);) text += "\n" + paragraph(line);
    return text;
  }

 private:
  static std::string firstSentence(const std::string& text) {
    return text.substr(0, std::min(text.find(". "), text.size() - 1));
  }
};

/// The arguments that are no options of the command that was chosen.
std::vector<std::string> unknownOptions(const CLI::App& app) {
  std::vector<std::string> unknown;
  for (const std::string& argument : app.remaining(true))
    if (argument.size() > 1 && argument[0] == '-') unknown.push_back(argument);
  return unknown;
}

std::vector<std::string> commandNames(const CLI::App& app) {
  std::vector<std::string> names;
  for (const CLI::App* command : named(&app, true)) names.push_back(command->get_name());
  return names;
}

void addOptionNames(const CLI::App& app, std::vector<std::string>& names) {
  for (const CLI::Option* option : app.get_options())
    for (const std::string& name : option->get_lnames()) names.push_back("--" + name);
  for (const CLI::App* group : named(&app, false)) addOptionNames(*group, names);
}

int showHelp(const CLI::App& app, const std::string& name) {
  const std::vector<std::string> commands = commandNames(app);
  if (!name.empty() && std::find(commands.begin(), commands.end(), name) == commands.end())
    throw UsageError("there is no subcommand '" + name + "'" + suggestion(name, commands));
  // Its own help() would be that of the command that runs: this one.
  const CLI::App& about = name.empty() ? app : *app.get_subcommand(name);
  fputs(Formatter().make_help(&about, "", CLI::AppFormatMode::Normal).c_str(), stdout);
  return kSuccess;
}

}  // namespace

std::string versionText() {
  const size_t level = raster::usableCpuLevel(raster::wantedCpuLevel());
  return std::string("rastertool " RASTER_VERSION "\ninstruction-set level: ") +
         raster::kCpuLevels[level].name;
}

void addHelpCommand(Commands& commands) {
  auto name = std::make_shared<std::string>();
  const CLI::App& app = commands.program();
  Command command = commands.add("help", "Says what the program or a command does.",
                                 [name, &app] { return showHelp(app, *name); });
  command.add("COMMAND", *name, "the command to say more about");
}

void addHelp(Commands& commands) {
  CLI::App& app = commands.program();
  const auto formatter = std::make_shared<Formatter>();
  app.formatter(formatter);
  app.set_version_flag("-V,--version", versionText,
                       "say the version and the instruction-set level in use");
  app.set_help_flag("-h,--help", "say this");
  app.footer(
      "A picture or file named - is standard input or output; words then go to standard error.\n"
      "Exit status: 0 done, 1 failed, 2 not understood; compare: 0 equal, 1 different, 2 failed.\n"
      "\"rastertool help COMMAND\" says more.");
  for (CLI::App* command : app.get_subcommands([](const CLI::App*) { return true; })) {
    command->formatter(formatter);
    command->set_help_flag("-h,--help", "say this");
    for (CLI::App* group : command->get_subcommands([](const CLI::App*) { return true; }))
      group->set_help_flag();
    const std::string status =
        command->get_name() == "compare"
            ? "Exit status: 0 equal, 1 different, 2 failed or not understood."
            : "Exit status: 0 done, 1 failed, 2 not understood.";
    std::string footer = command->get_footer();
    if (!footer.empty()) footer += ".\n";
    command->footer(footer += status);
  }
}

std::string explanation(const Commands& commands, const UsageError& error, int argc,
                        const char* const* argv) {
  const CLI::App& app = commands.program();
  const std::vector<std::string> known = commandNames(app);
  const std::string first = argc > 1 ? argv[1] : "";
  const bool isOption = first.empty() || first[0] == '-';
  if (!isOption && std::find(known.begin(), known.end(), first) == known.end())
    return "there is no subcommand '" + first + "'" + suggestion(first, known);
  if (argc == 1) return "a subcommand is required";
  const auto unknown = unknownOptions(app);
  if (unknown.empty()) return error.what();
  const std::string name = unknown[0].substr(0, unknown[0].find('='));
  std::vector<std::string> names;
  addOptionNames(app, names);
  for (const CLI::App* chosen : app.get_subcommands()) addOptionNames(*chosen, names);
  return "there is no option '" + name + "'" + suggestion(name, names);
}

}  // namespace tool

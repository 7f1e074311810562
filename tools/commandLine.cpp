// SPDX-License-Identifier: MIT

#include "commandLine.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <sstream>
#include <utility>

namespace tool {

Option Option::required() const {
  option->required();
  return *this;
}

Option Option::form(const std::string& name) const {
  option->type_name(name);
  return *this;
}

Option Option::check(const Check& check) const {
  option->check(CLI::Validator(check.fault, check.form));
  return *this;
}

Option Option::oneOf(std::initializer_list<std::string> values) const {
  option->check(CLI::IsMember(values));
  return *this;
}

Option Option::oneOf(const std::vector<uint32>& values) const {
  option->check(CLI::IsMember(values));
  return *this;
}

Option Option::values(int count) const {
  option->expected(count);
  return *this;
}

Option Option::needs(Option other) const {
  option->needs(other.option);
  return *this;
}

Option Option::excludes(Option other) const {
  option->excludes(other.option);
  return *this;
}

Option Option::withDefault() const {
  option->capture_default_str();
  return *this;
}

Option OptionList::add(const std::string& name, std::string& value,
                       const std::string& description) {
  return Option(app->add_option(name, value, description));
}

Option OptionList::add(const std::string& name, std::vector<std::string>& values,
                       const std::string& description) {
  return Option(app->add_option(name, values, description));
}

Option OptionList::add(const std::string& name, int32& value, const std::string& description) {
  return Option(app->add_option(name, value, description));
}

Option OptionList::add(const std::string& name, uint32& value, const std::string& description) {
  return Option(app->add_option(name, value, description));
}

Option OptionList::add(const std::string& name, uint64& value, const std::string& description) {
  return Option(app->add_option(name, value, description));
}

Option OptionList::add(const std::string& name, double& value, const std::string& description) {
  return Option(app->add_option(name, value, description));
}

Option OptionList::add(const std::string& name, std::optional<uint32>& value,
                       const std::string& description) {
  return Option(app->add_option(name, value, description));
}

Option OptionList::add(const std::string& name, std::optional<double>& value,
                       const std::string& description) {
  return Option(app->add_option(name, value, description));
}

Option OptionList::addText(const std::string& name, const TakeText& take,
                           const std::string& description) {
  return Option(app->add_option_function<std::string>(name, take, description));
}

Option OptionList::addTexts(const std::string& name, const TakeTexts& take,
                            const std::string& description) {
  return Option(app->add_option_function<std::vector<std::string>>(name, take, description));
}

Option OptionList::addFlag(const std::string& name, bool& isGiven, const std::string& description) {
  return Option(app->add_flag(name, isGiven, description));
}

Option OptionList::addFlag(const std::string& name, const std::string& description) {
  return Option(app->add_flag(name)->description(description));
}

OptionList Command::addChoice(const std::string& name, const std::string& description) {
  CLI::Option_group* group = app->add_option_group(name, description);
  group->require_option(1);
  return OptionList(group);
}

void Command::footer(const std::string& text) { app->footer(text); }

Commands::Commands(const std::string& programName, const std::string& description)
    : app(std::make_unique<CLI::App>(description, programName)) {
  app->require_subcommand(1);
}

Commands::~Commands() = default;

Command Commands::add(const std::string& name, const std::string& description,
                      std::function<int()> body, int failureStatus) {
  CLI::App* command = app->add_subcommand(name, description);
  command->callback([this, body = std::move(body), failureStatus] {
    chosen = body;
    statusOfFailure = failureStatus;
  });
  return Command(command);
}

std::optional<std::string> Commands::parse(std::vector<std::string> arguments) {
  std::reverse(arguments.begin(), arguments.end());  // the library takes the last one first
  try {
    app->parse(std::move(arguments));
    return {};
  } catch (const CLI::Success& asked) {
    std::ostringstream answer;
    app->exit(asked, answer);
    return answer.str();
  } catch (const CLI::ParseError& error) {
    throw UsageError(error.what());
  }
}

}  // namespace tool

// SPDX-License-Identifier: MIT
//
// Commands and their options, as far as this program has them. Behind it is the argument library
// (CLI11), whose header takes seconds to compile: only the sources that ask it include it.

#ifndef RASTER_TOOLS_COMMAND_LINE_H
#define RASTER_TOOLS_COMMAND_LINE_H

#include <functional>
#include <initializer_list>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "baseTypes.h"
#include "failure.h"

namespace CLI {
class App;
class Option;
}  // namespace CLI

namespace tool {

/// What an option's text is checked for before it is taken.
struct Check {
  std::string form;  ///< what help says of it
  /// What is wrong with a text, or nothing.
  std::function<std::string(const std::string&)> fault;
};

/// An option of a command, or one of its arguments. Each function returns the option itself.
class Option {
 public:
  explicit Option(CLI::Option* of) : option(of) {}

  Option required() const;
  /// The name of its value in help.
  Option form(const std::string& name) const;
  Option check(const Check& check) const;
  Option oneOf(std::initializer_list<std::string> values) const;
  Option oneOf(const std::vector<uint32>& values) const;
  /// It takes so many values.
  Option values(int count) const;
  Option needs(Option other) const;
  Option excludes(Option other) const;
  /// Help shows the value that the variable has now.
  Option withDefault() const;

 private:
  CLI::Option* option;
};

/// Options of a command, or of a group within it. What has a name with dashes is an option, what
/// has none is an argument. Variables stay until the command has run.
class OptionList {
 public:
  explicit OptionList(CLI::App* of) : app(of) {}

  Option add(const std::string& name, std::string& value, const std::string& description);
  Option add(const std::string& name, std::vector<std::string>& values,
             const std::string& description);
  Option add(const std::string& name, int32& value, const std::string& description);
  Option add(const std::string& name, uint32& value, const std::string& description);
  Option add(const std::string& name, uint64& value, const std::string& description);
  Option add(const std::string& name, double& value, const std::string& description);
  Option add(const std::string& name, std::optional<uint32>& value, const std::string& description);
  Option add(const std::string& name, std::optional<double>& value, const std::string& description);

  /// An option whose text goes through a function, which throws UsageError. A target may be a
  /// std::optional, or a std::vector that takes several.
  template <class Target, class Value>
  Option addParsed(const std::string& name, Target& target, Value (*parse)(const std::string&),
                   const char* form, const std::string& description) {
    return addText(
               name, [&target, parse](const std::string& text) { target = parse(text); },
               description)
        .form(form);
  }
  template <class Value>
  Option addParsed(const std::string& name, std::vector<Value>& target,
                   Value (*parse)(const std::string&), const char* form,
                   const std::string& description) {
    const auto take = [&target, parse](const std::vector<std::string>& texts) {
      for (const std::string& text : texts) target.push_back(parse(text));
    };
    return addTexts(name, take, description).form(form);
  }

  /// An option without a value.
  Option addFlag(const std::string& name, bool& isGiven, const std::string& description);
  /// One that says what is so without it.
  Option addFlag(const std::string& name, const std::string& description);

 protected:
  CLI::App* app;

 private:
  using TakeText = std::function<void(const std::string&)>;
  using TakeTexts = std::function<void(const std::vector<std::string>&)>;
  Option addText(const std::string& name, const TakeText& take, const std::string& description);
  Option addTexts(const std::string& name, const TakeTexts& take, const std::string& description);
};

class Command : public OptionList {
 public:
  using OptionList::OptionList;

  /// A group of options of which exactly one is given.
  OptionList addChoice(const std::string& name, const std::string& description);
  /// What help says below the options.
  void footer(const std::string& text);
};

/// The subcommands of the program, and which of them the command line chose.
class Commands {
 public:
  Commands(const std::string& programName, const std::string& description);
  ~Commands();
  Commands(const Commands&) = delete;
  Commands& operator=(const Commands&) = delete;

  /// Adds a subcommand. `body` runs after the whole command line was understood and returns the
  /// exit status; when it throws Failure the program ends with `failureStatus`.
  Command add(const std::string& name, const std::string& description, std::function<int()> body,
              int failureStatus = kFailure);

  /// Reads the arguments, the program's name left out, and chooses a subcommand; throws UsageError.
  /// Where they ask for help or the version instead, returns the answer.
  std::optional<std::string> parse(std::vector<std::string> arguments);

  CLI::App& program() { return *app; }
  const CLI::App& program() const { return *app; }

  std::function<int()> chosen;
  int statusOfFailure = kFailure;

 private:
  std::unique_ptr<CLI::App> app;
};

}  // namespace tool

#endif

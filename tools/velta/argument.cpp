#include "argument.h"

#include <set>
#include <sstream>
#include <string_view>

namespace velta_tool {
namespace {

std::vector<std::string> Split(const std::string& text, char separator) {
  std::vector<std::string> parts;
  std::istringstream in(text);
  for (std::string part; std::getline(in, part, separator);) parts.push_back(part);
  return parts;
}

/// Names in the order of the alphabet: the sets have the order of addresses.
std::string NamesOf(const std::set<CLI::Option*>& options) {
  std::set<std::string> names;
  for (const CLI::Option* const option : options) names.insert(option->get_name());
  return Joined({names.begin(), names.end()}, ", ");
}

/// The type's own name, which is "TEXT" when a command has not given one, and what the checks
/// accept: "TEXT:FILE.dff or .prj", "TEXT:{proj,wkt}", "DIR:FILE".
void TakeValue(const std::string& typeName, Argument& argument) {
  const std::size_t colon = typeName.find(':');
  argument.value = typeName.substr(0, colon);
  const bool isNamed = argument.value != "TEXT";
  if (!isNamed && colon != typeName.npos) argument.value = typeName.substr(colon + 1);
  if (argument.value == "DIR") {
    argument.kind = Argument::Kind::kDirectory;
  } else if (argument.value.starts_with('{')) {
    argument.kind = Argument::Kind::kChoice;
    argument.choices = Split(argument.value.substr(1, argument.value.size() - 2), ',');
    argument.value = Joined(argument.choices, "|");
  } else if (argument.value.starts_with("FILE")) {
    argument.kind = Argument::Kind::kFile;
    std::istringstream words(argument.value.substr(std::string_view("FILE").size()));
    for (std::string word; words >> word;) {
      if (word.starts_with('.')) argument.extensions.push_back(word);
    }
  } else {
    argument.kind = Argument::Kind::kOther;
  }
}

}  // namespace

Argument Describe(const CLI::Option& option) {
  Argument argument = {};
  argument.isOption = option.nonpositional();
  argument.names = Split(option.get_name(!argument.isOption, argument.isOption), ',');
  argument.text = option.get_description();
  if (option.get_items_expected_max() > 0) TakeValue(option.get_type_name(), argument);
  argument.isRequired = option.get_required();
  argument.isRepeated = option.get_expected_max() > 1;
  const auto remark = [&argument](const std::string& what, const std::string& names) {
    if (!names.empty()) argument.remarks.push_back(what + names);
  };
  if (argument.isRequired) argument.remarks.emplace_back("required");
  remark("default: ", option.get_default_str());
  remark("needs ", NamesOf(option.get_needs()));
  remark("not with ", NamesOf(option.get_excludes()));
  return argument;
}

std::vector<Argument> ArgumentsOf(const CLI::App& command) {
  std::vector<Argument> arguments;
  for (const CLI::Option* const option : command.get_options()) {
    arguments.push_back(Describe(*option));
  }
  return arguments;
}

std::string Joined(const std::vector<std::string>& strings, const std::string& separator) {
  std::string joined;
  for (const std::string& string : strings) {
    joined += (joined.empty() ? "" : separator) + string;
  }
  return joined;
}

}  // namespace velta_tool

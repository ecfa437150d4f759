#include "man_page.h"

#include <string_view>
#include <vector>

#include "argument.h"
#include "help_text.h"

namespace velta_manual {
namespace {

using velta_tool::Argument;

/// Lines as they come, so that no name of a page or an option is divided.
constexpr char kLayout[] = ".nh\n.ad l\n";

/// Text as roff shows it, without the typographical quotation marks, dashes and accents that it
/// would make of what is typed.
std::string Escaped(const std::string& text) {
  std::string escaped;
  bool isLineBegin = true;
  for (const char c : text) {
    if (isLineBegin && c == '.') escaped += "\\&";
    switch (c) {
      case '\\':
        escaped += "\\e";
        break;
      case '-':
        escaped += "\\-";
        break;
      case '\'':
        escaped += "\\(aq";
        break;
      case '`':
        escaped += "\\(ga";
        break;
      case '^':
        escaped += "\\(ha";
        break;
      case '~':
        escaped += "\\(ti";
        break;
      default:
        escaped += c;
    }
    isLineBegin = c == '\n';
  }
  return escaped;
}

std::string Bold(const std::string& text) { return "\\fB" + Escaped(text) + "\\fR"; }
std::string Italic(const std::string& text) { return "\\fI" + Escaped(text) + "\\fR"; }
std::string Reference(const std::string& page) { return Bold(page) + "(1)"; }

char Upper(char c) { return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c; }

std::string Upper(std::string text) {
  for (char& c : text) c = Upper(c);
  return text;
}

/// A sentence as the rest of a line that begins with a name.
std::string BehindName(std::string sentence) {
  if (sentence.ends_with('.')) sentence.pop_back();
  for (char& c : sentence) {
    if (c == '\n') c = ' ';
  }
  if (sentence[0] >= 'A' && sentence[0] <= 'Z') {
    sentence[0] = static_cast<char>(sentence[0] - 'A' + 'a');
  }
  return sentence;
}

std::string Section(const std::string& title, const std::string& text) {
  constexpr std::string_view kParagraph = ".PP\n";  // which a heading begins by itself
  return ".SH " + title + '\n' + text.substr(text.starts_with(kParagraph) ? kParagraph.size() : 0);
}

/// An argument as it is typed.
std::string Typed(const Argument& argument) {
  std::string typed;
  for (const std::string& name : argument.names) {
    typed += (typed.empty() ? "" : ", ") + (argument.isOption ? Bold(name) : Italic(name));
  }
  if (argument.isOption && !argument.value.empty()) typed += ' ' + Italic(argument.value);
  return typed + (argument.isRepeated ? "..." : "");
}

std::string Synopsis(const CLI::App& command) {
  if (!command.get_parent()) return Bold("velta") + ' ' + Italic("COMMAND") + " ...\n";
  std::string options;
  std::string places;
  for (const Argument& argument : velta_tool::ArgumentsOf(command)) {
    if (argument.isOption) {
      options += argument.isRequired ? ' ' + Typed(argument) : "";
    } else {
      places += argument.isRequired ? ' ' + Typed(argument) : " [" + Typed(argument) + ']';
    }
  }
  return Bold("velta " + command.get_name()) + options + " [" + Italic("OPTION") + "]..." + places +
         '\n';
}

std::string Options(const CLI::App& command) {
  std::string text;
  for (const Argument& argument : velta_tool::ArgumentsOf(command)) {
    text += ".TP\n" + Typed(argument) + '\n' + Escaped(argument.text);
    if (!argument.remarks.empty()) {
      text += " (" + Escaped(velta_tool::Joined(argument.remarks, "; ")) + ')';
    }
    text += '\n';
  }
  return text;
}

std::string Paragraphs(const Block& block) {
  std::string text;
  bool isInParagraph = false;
  for (const Block::Line& line : block.lines) {
    if (line.isIndented) {
      text += ".TP\n" + Escaped(line.term) + '\n';
    } else if (!isInParagraph) {
      text += ".PP\n";
    }
    isInParagraph = !line.isIndented;
    text += Escaped(line.text) + '\n';
  }
  return text;
}

std::string Example(const Block& block) {
  std::string heading;
  std::string commands;
  for (const Block::Line& line : block.lines) {
    (line.isIndented ? commands : heading) += Escaped(line.text) + '\n';
  }
  if (!heading.empty()) {
    heading[0] = Upper(heading[0]);
    heading.back() = ':';
    heading = ".PP\n" + heading + '\n';
  }
  return heading + ".IP\n.nf\n" + commands + ".fi\n";
}

/// What a help text has of a kind.
std::string TextOf(const CLI::App& command, Block::Kind kind) {
  std::string text;
  for (const Block& block : BlocksOf(command.get_footer())) {
    if (block.kind == kind)
      text += kind == Block::Kind::kExample ? Example(block) : Paragraphs(block);
  }
  return text;
}

}  // namespace

std::string PageName(const CLI::App& command) {
  return command.get_parent() ? "velta-" + command.get_name() : command.get_name();
}

std::string ManPage(const CLI::App& command, const std::string& date) {
  const bool isProgram = command.get_parent() == nullptr;
  const CLI::App& program = isProgram ? command : *command.get_parent();
  const std::string name = PageName(command);
  const std::string& description = command.get_description();
  std::string commands;
  std::string others = isProgram ? "" : Reference(PageName(program));
  for (const CLI::App* const other : program.get_subcommands({})) {
    const std::string reference = Reference(PageName(*other));
    commands += ".TP\n" + reference + '\n' + Escaped(other->get_description()) + '\n';
    if (other != &command) others += (others.empty() ? "" : ",\n") + reference;
  }
  return ".TH " + Upper(name) + " 1 " + date + " \"velta " VELTA_VERSION "\"\n" + kLayout +
         Section("NAME", Escaped(name) + " \\- " + Escaped(BehindName(description)) + '\n') +
         Section("SYNOPSIS", Synopsis(command)) +
         Section("DESCRIPTION", Escaped(description) + '\n' + TextOf(command, Block::Kind::kText)) +
         (isProgram ? Section("COMMANDS", commands) : "") + Section("OPTIONS", Options(command)) +
         Section("EXIT STATUS", TextOf(program, Block::Kind::kExitStatus)) +
         Section("EXAMPLES", TextOf(program, Block::Kind::kAboutExamples) +
                                 TextOf(command, Block::Kind::kExample)) +
         Section("SEE ALSO", others + '\n');
}

}  // namespace velta_manual

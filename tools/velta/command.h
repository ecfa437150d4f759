#pragma once

#include <CLI/App.hpp>
#include <functional>
#include <string>
#include <string_view>

#include "velta/result_codes.h"

namespace velta_tool {

/// Exit statuses.
inline constexpr int kDone = 0;
inline constexpr int kFailed = 1;
inline constexpr int kWrongCall = 2;

/// What the command line asks for; answers with the exit status. What it throws is a failure, the
/// text of which says what went wrong.
using Action = std::function<int()>;

/// Each adds a command to the program; when the command line names it, `action` becomes its work.
void AddIngest(CLI::App& program, Action& action);
void AddList(CLI::App& program, Action& action);
void AddGenerate(CLI::App& program, Action& action);
void AddMerge(CLI::App& program, Action& action);
void AddDecode(CLI::App& program, Action& action);
void AddEncode(CLI::App& program, Action& action);
void AddDump(CLI::App& program, Action& action);
void AddTransform(CLI::App& program, Action& action);
void AddExport(CLI::App& program, Action& action);
void AddMap(CLI::App& program, Action& action);

/// Tells the user on standard error what failed.
void ReportFailure(std::string_view what);

/// Tells the user on standard error what is worth knowing, though nothing failed; but not one who
/// wants to know failures only.
void ReportNote(std::string_view what);

/// A result code as eight hexadecimal digits after "0x".
std::string CodeText(orx::cs::velta::ResultCode code);

/// A result code with its meaning.
std::string Meaning(orx::cs::velta::ResultCode code);

}  // namespace velta_tool

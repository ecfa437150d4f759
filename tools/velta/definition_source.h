#pragma once

#include <CLI/App.hpp>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "geodesy/definition.h"

namespace velta_tool {

/// Where a transformation is taken from: files, or a stream of messages.
struct DefinitionSource {
  std::string datum;
  std::string projection;
  std::string messages;
  std::optional<std::uint32_t> systemId;  ///< of the stream's systems

  /// The names of what is read.
  std::vector<std::string> names() const { return {datum, projection, messages}; }
};

/// Adds "--messages" and "--system-id".
/// \return the first of them
CLI::Option* AddMessages(CLI::App& command, DefinitionSource& source);

/// Reads the definition, and tells what is remarkable about it.
/// \throws std::runtime_error when there is none to be had
Definition Read(const DefinitionSource& source);

}  // namespace velta_tool

#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <cstdint>
#include <cstring>
#include <memory>
#include <nlohmann/json.hpp>
#include <span>
#include <string>
#include <string_view>

#include "busy.h"
#include "command.h"
#include "files.h"
#include "orxregistry/bin_value.h"
#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"
#include "orxutils/file_error.h"
#include "orxutils/orx_string.h"

namespace velta_tool {
namespace {

using nlohmann::ordered_json;
using orx::TGenericRegistryKey;

/// Takes any value, without a copy.
class AnyValue : public orx::bin_value {
 public:
  std::int32_t SetFromDescriptor(const orx::ValueDescriptor& descriptor, const void* data,
                                 bool) override {
    descriptor_ = descriptor;
    data_ = data;
    return 0;
  }
  orx::ValueDescriptor GetDescriptor() const override { return descriptor_; }
  const void* GetRawData() const override { return data_; }
  std::uint32_t GetByteSize() const override { return descriptor_.size * descriptor_.dimension; }
  std::uint32_t GetType() const override { return descriptor_.type; }
  const void* GetData() const override { return data_; }
  std::uint32_t GetSize() const override { return descriptor_.size; }

 private:
  orx::ValueDescriptor descriptor_ = {};
  const void* data_ = nullptr;
};

std::string Hex(std::span<const std::uint8_t> bytes) {
  constexpr std::string_view kDigits = "0123456789abcdef";
  std::string text;
  text.reserve(bytes.size() * 2);
  for (const std::uint8_t byte : bytes) {
    text += kDigits[byte >> 4];
    text += kDigits[byte & 0xF];
  }
  return text;
}

/// A little-endian integer of 1 to 8 bytes.
template <class Integer>
Integer IntegerOf(std::span<const std::uint8_t> bytes) {
  std::uint64_t value = 0;
  for (std::size_t i = bytes.size(); i-- > 0;) value = value << 8 | bytes[i];
  const auto unused = 64 - 8 * static_cast<unsigned>(bytes.size());
  return static_cast<Integer>(value << unused) >> unused;
}

/// Adds what a value says, if its kind is plain.
void AddPlainValue(const TGenericRegistryKey& key, const std::wstring& name,
                   std::span<const std::uint8_t> bytes, ordered_json& json) {
  const std::uint32_t type = key.GetValueType(name);
  if (type == orx::kWideString) {
    json["value"] = orx::ToUtf8(orx::GetRegValue(key, name, std::wstring(), 0));
    return;
  }
  if (key.GetValueDim(name) != 1 || bytes.empty() || bytes.size() > sizeof(std::uint64_t)) return;
  if (type == orx::kSignedInteger) json["value"] = IntegerOf<std::int64_t>(bytes);
  if (type == orx::kUnsignedInteger) json["value"] = IntegerOf<std::uint64_t>(bytes);
}

ordered_json ValueJson(const TGenericRegistryKey& key, const std::wstring& name) {
  AnyValue value;
  const bool readable = key.GetValue(name, value, 0, false);
  const std::uint32_t size = key.GetValueSize(name);
  const std::span bytes(static_cast<const std::uint8_t*>(value.GetRawData()), readable ? size : 0);
  ordered_json json = {{"name", orx::ToUtf8(name)},
                       {"type", key.GetValueType(name)},
                       {"size", size},
                       {"dimension", key.GetValueDim(name)},
                       {"data", Hex(bytes)}};
  AddPlainValue(key, name, bytes, json);
  return json;
}

/// Writes a key with everything below it; a value takes one line.
void WriteKey(const TGenericRegistryKey& key, const std::string& indent, Output& out) {
  std::string& text = out.pending();
  text += indent + "{\"name\": " + ordered_json(orx::ToUtf8(key.GetName())).dump() +
          ", \"dimension\": " + std::to_string(key.GetKeyDim()) + ", \"values\": [";
  std::string separator = "\n";
  for (const std::wstring& name : key.GetValueNames()) {
    text += separator + indent + "  " + ValueJson(key, name).dump();
    separator = ",\n";
  }
  text += "], \"keys\": [";
  separator = "\n";
  for (orx::TGenRegKeyIterator keys(key); keys;) {
    text += separator;
    out.FlushIfLarge();
    WriteKey(TGenericRegistryKey(keys++), indent + "  ", out);
    separator = ",\n";
  }
  text += "]}";
}

int Run(const std::string& file) {
  RequireFile(file);
  const Busy busy("reading", {file});
  orx::ForgetFileError();
  const orx::TInFileKey tree(ToWide(file), nullptr, nullptr, true, orx::kRegistryFlags);
  Output out({file});
  WriteKey(TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree)), "", out);
  out.pending() += '\n';
  out.Flush();
  const std::string error = ErrorStateText(tree.GetErrorState(), orx::KeptFileError());
  if (error.empty()) return kDone;
  ReportFailure(file + ": " + error + "; shown is what could be read");
  return kFailed;
}

}  // namespace

void AddDump(CLI::App& program, Action& action) {
  const auto file = std::make_shared<std::string>();
  CLI::App* command =
      program.add_subcommand("dump", "Shows everything that a datum or projection file holds.");
  command->add_option("FILE", *file, "the file, whatever its extension")
      ->required()
      ->check(kFileName);
  command->footer(
      "Prints the tree of keys as JSON: the values of a key with type (1 bytes, 2 signed integer,\n"
      "3 unsigned integer, 5 text), size in bytes, dimension and bytes, and what integers and\n"
      "texts say. Of a damaged file it prints what can be read.\n"
      "\n"
      "Example:\n"
      "  velta ingest --datum-dir . --projection-dir . examples/streams/dhdn.rtcm3\n"
      "  velta dump AUTO_DHDN_BESEL.dff");
  command->callback([&action, file] { action = [file] { return Run(*file); }; });
}

}  // namespace velta_tool

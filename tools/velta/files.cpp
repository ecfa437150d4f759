#include "files.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <iostream>
#include <random>
#include <stdexcept>
#include <system_error>
#include <utility>

#include "command.h"
#include "interrupt.h"
#include "orxregistry/in_file_key.h"
#include "orxutils/file_error.h"
#include "orxutils/file_funcs.h"
#include "orxutils/orx_string.h"
#include "orxutils/path.h"
#include "store/registry_tree.h"
#include "terminal.h"
#include "velta/file_names.h"

namespace velta_tool {
namespace fs = std::filesystem;
namespace {

constexpr std::size_t kInputBuffer = std::size_t{64} * 1024;
constexpr std::size_t kLargeOutput = std::size_t{64} * 1024;
constexpr std::string_view kStandardStream = "-";

std::runtime_error FileError(const std::string& name, const std::string& what) {
  return std::runtime_error(name + ": " + what + ": " + std::generic_category().message(errno));
}

/// Passes on what a stream has, and lets the user end the program where the stream waits for more.
class InterruptibleBuffer : public std::streambuf {
 public:
  InterruptibleBuffer(std::string name, std::streambuf& source)
      : name_(std::move(name)), source_(source), memory_(kInputBuffer) {}

 private:
  int_type underflow() override try {
    if (IsInterrupted() || !Await()) return traits_type::eof();
    const auto room = static_cast<std::streamsize>(memory_.size());
    const std::streamsize there = std::clamp<std::streamsize>(source_.in_avail(), 1, room);
    const std::streamsize got = source_.sgetn(memory_.data(), there);
    setg(memory_.data(), memory_.data(), memory_.data() + got);
    return got > 0 ? traits_type::to_int_type(memory_.front()) : traits_type::eof();
  } catch (const std::ios_base::failure& error) {
    throw std::runtime_error(name_ + ": cannot be read: " + error.code().message());
  }

  /// \return false at the end
  bool Await() {
    const WaitingForInput waiting;
    return source_.sgetc() != traits_type::eof();
  }

  std::string name_;
  std::streambuf& source_;
  std::vector<char> memory_;
};

bool IsInput(const std::string& input, const fs::path& path) {
  if (input == kStandardStream) return orx::FileFuncs::isSameFile(stdin, path);
  std::error_code ignored;
  return fs::equivalent(orx::ToSystemPath(PathOf(input)), path, ignored);
}

/// True when standard output goes into a file that is read.
bool IsWrittenTo(const std::string& input) {
  if (input == kStandardStream) return false;  // a terminal is both
  std::error_code ignored;
  const fs::path path = orx::ToSystemPath(PathOf(input));
  return fs::is_regular_file(path, ignored) && orx::FileFuncs::isSameFile(stdout, path);
}

bool IsTerminal(const fs::path& path) {
  std::error_code ignored;
  if (!fs::is_character_file(path, ignored)) return false;
  const std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(
      std::fopen(path.string().c_str(), "ab"), &std::fclose);
  return file && orx::FileFuncs::isTerminal(file.get());
}

/// True for a registry file under any name, and for any name that a registry file may have.
bool IsRegistryFile(const std::string& name) {
  if (KindOf(name) != FileKind::kOther) return true;
  if (!orx::FileFuncs::isFileExists(ToWide(name))) return false;
  const std::uint32_t error =
      orx::TInFileKey(ToWide(name), nullptr, nullptr, true, orx::kRegistryFlags).GetErrorState();
  return error == orx::kRegistryOk || error == orx::kDamaged;
}

CLI::Validator KindCheck(const std::string& extensions, bool (*accepts)(FileKind)) {
  return CLI::Validator(
      [extensions, accepts](std::string& name) {
        return accepts(KindOf(name)) ? std::string() : name + " is no " + extensions + " file";
      },
      "FILE" + extensions);
}

}  // namespace

std::wstring ToWide(const std::string& argument) {
  std::optional<std::wstring> wide = orx::FromUtf8(argument);
  if (!wide) throw std::runtime_error(argument + ": the name is not UTF-8");
  return *std::move(wide);
}

fs::path PathOf(const std::string& name) { return std::u8string(name.begin(), name.end()); }

std::string NameOf(const fs::path& path) {
  const std::u8string name = path.u8string();
  return {name.begin(), name.end()};
}

FileKind KindOf(const std::string& file) {
  const std::wstring name = orx::Widen(file);
  const auto ends = [&](std::wstring_view extension) {
    return name.size() >= extension.size() &&
           orx::EqualsIgnoringCase(name.substr(name.size() - extension.size()), extension);
  };
  if (ends(orx::cs::velta::kDatumFileExtension)) return FileKind::kDatum;
  if (ends(orx::cs::velta::kProjectionFileExtension)) return FileKind::kProjection;
  return FileKind::kOther;
}

std::string ExtensionOf(FileKind kind) {
  return orx::ToUtf8(kind == FileKind::kDatum ? orx::cs::velta::kDatumFileExtension
                                              : orx::cs::velta::kProjectionFileExtension);
}

void RequireFile(const std::string& file) {
  std::error_code error;
  const fs::file_status status = fs::status(orx::ToSystemPath(PathOf(file)), error);
  if (status.type() == fs::file_type::not_found) {
    throw std::runtime_error(file + ": there is no such file");
  }
  if (error) throw std::runtime_error(file + ": cannot be read: " + error.message());
  if (fs::is_directory(status)) throw std::runtime_error(file + ": is a directory");
  if (!fs::is_regular_file(status)) throw std::runtime_error(file + ": is no regular file");
}

const CLI::Validator kFileName(
    [](std::string& name) { return name.empty() ? "the name is empty" : ""; }, "FILE");
const CLI::Validator kDatumFile = KindCheck(ExtensionOf(FileKind::kDatum),
                                            [](FileKind kind) { return kind == FileKind::kDatum; });
const CLI::Validator kProjectionFile =
    KindCheck(ExtensionOf(FileKind::kProjection),
              [](FileKind kind) { return kind == FileKind::kProjection; });
const CLI::Validator kDatumOrProjectionFile =
    KindCheck(ExtensionOf(FileKind::kDatum) + " or " + ExtensionOf(FileKind::kProjection),
              [](FileKind kind) { return kind != FileKind::kOther; });

Input::Input(const std::string& name) : memory_(kInputBuffer) {
  if (name == kStandardStream) {
    buffer_ = std::make_unique<InterruptibleBuffer>("standard input", *std::cin.rdbuf());
    return;
  }
  const fs::path path = PathOf(name);
  std::error_code ignored;  // opening it tells
  if (fs::is_directory(path, ignored)) throw std::runtime_error(name + ": is a directory");
  file_.pubsetbuf(memory_.data(), static_cast<std::streamsize>(memory_.size()));
  const WaitingForInput waiting;  // for whoever writes into a pipe of that name
  if (!file_.open(orx::ToSystemPath(path), std::ios::in | std::ios::binary)) {
    throw FileError(name, "cannot be read");
  }
  buffer_ = std::make_unique<InterruptibleBuffer>(name, file_);
}

std::uint64_t SizeTogether(const std::vector<std::string>& files) {
  std::uint64_t bytes = 0;
  for (const std::string& file : files) {
    std::error_code error;
    const fs::path path = orx::ToSystemPath(PathOf(file));
    if (!fs::is_regular_file(path, error)) return 0;
    const std::uintmax_t size = fs::file_size(path, error);
    if (error) return 0;
    bytes += size;
  }
  return bytes;
}

Output::Output(const std::string& name, OutputKind kind, const std::vector<std::string>& inputs)
    : name_(name), kind_(kind), buffer_(std::cout.rdbuf()) {
  const bool isStandard = name == kStandardStream;
  const fs::path path = isStandard ? fs::path() : orx::ToSystemPath(PathOf(name));
  RefuseInputs(inputs, path);
  const bool isTerminal = isStandard ? orx::FileFuncs::isTerminal(stdout) : IsTerminal(path);
  if (isTerminal && kind == OutputKind::kBinary) {
    throw WrongCall("frames are not written to a terminal: name a file with -o, or use a pipe");
  }
  if (isStandard) return;
  if (IsRegistryFile(name)) throw WrongCall(name + ": a datum or projection file is not replaced");
  Open(path);
  buffer_ = &file_;
}

/// \param path empty for standard output
void Output::RefuseInputs(const std::vector<std::string>& inputs, const fs::path& path) {
  for (const std::string& input : inputs) {
    if (input.empty()) continue;
    const bool isWritten = path.empty() ? IsWrittenTo(input) : IsInput(input, path);
    if (!isWritten) continue;
    throw WrongCall((path.empty() ? input + ": is standard output" : name_ + ": is the input") +
                    ", too");
  }
}

void Output::Open(const fs::path& path) {
  std::error_code error;
  const fs::file_status status = fs::status(path, error);
  fs::path opened = path;
  if (!fs::exists(status) || fs::is_regular_file(status)) {
    place_ = fs::exists(status) ? fs::canonical(path) : path;
    do {
      beside_ =
          place_.parent_path() / ("velta." + std::to_string(std::random_device()()) + ".part");
    } while (fs::exists(beside_, error));
    opened = beside_;
  }
  if (!file_.open(opened, std::ios::out | std::ios::binary)) Fail();
  if (fs::exists(status) && !beside_.empty()) fs::permissions(beside_, status.permissions(), error);
}

void Output::FlushIfLarge() {
  if (pending_.size() >= kLargeOutput) Flush();
}

void Output::Flush() {
  if (kind_ == OutputKind::kText) pending_ = WithoutControls(std::move(pending_));
  if (beside_.empty() && orx::FileFuncs::isTerminal(stdout)) ClearLine();
  const auto size = static_cast<std::streamsize>(pending_.size());
  const bool written = buffer_->sputn(pending_.data(), size) == size && buffer_->pubsync() == 0;
  pending_.clear();
  if (!written) Fail();
}

void Output::Finish() {
  Flush();
  if (beside_.empty()) return;
  if (!file_.close()) Fail();
  std::error_code error;
  fs::rename(beside_, place_, error);
  if (error) {
    errno = error.value();
    Fail();
  }
  beside_.clear();
}

void Output::Discard() {
  if (beside_.empty()) return;
  file_.close();
  std::error_code ignored;
  fs::remove(beside_, ignored);
  beside_.clear();
}

void Output::Fail() {
  const int reason = errno;
  Discard();
  errno = reason;
  throw FileError(name_ == kStandardStream ? "standard output" : name_, "cannot be written");
}

std::string ErrorStateText(std::uint32_t error, const std::string& reason) {
  const std::string state = "error state " + std::to_string(error) + ": ";
  switch (error) {
    case orx::kRegistryOk:
      return "";
    case orx::kCannotBeOpened:
      return state + "cannot be opened" + (reason.empty() ? "" : ": " + reason);
    case orx::kNotARegistryFile:
      return state + "not a registry file";
    default:
      return state + "damaged";
  }
}

FileState StateOf(const std::string& file) {
  orx::ForgetFileError();
  const orx::TInFileKey tree(ToWide(file), nullptr, nullptr, true, orx::kRegistryFlags);
  orx::TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree)).LookInto();
  const std::uint32_t error = tree.GetErrorState();
  return {error, ErrorStateText(error, orx::KeptFileError())};
}

}  // namespace velta_tool

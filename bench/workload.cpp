#include "workload.h"

#include <cstdio>
#include <cstdlib>

#include "orxregistry/in_file_key.h"
#include "velta/message_units.h"

namespace velta_bench {
namespace fs = std::filesystem;
namespace velta = orx::cs::velta;
namespace {

bool AskDatumMessage(const velta::RTCMGenerator& generator, const Position& at) {
  return generator.getRtcmDatumMessage(at.latitude, at.longitude, 0) != nullptr;
}

bool AskGrid(const velta::RTCMGenerator& generator, const Position& at) {
  return generator.get1023(at.latitude, at.longitude, 0) != nullptr;
}

orx::TGenericRegistryKey FirstSubKey(const orx::TGenericRegistryKey& key) {
  return orx::TGenericRegistryKey(orx::TGenRegKeyIterator(key)++);
}

std::size_t ValueBytes(const orx::TGenericRegistryKey& key) {
  std::size_t bytes = 0;
  for (const auto& name : key.GetValueNames()) bytes += key.GetValueSize(name);
  for (orx::TGenRegKeyIterator i(key); i;) bytes += ValueBytes(orx::TGenericRegistryKey(i++));
  return bytes;
}

/// A directory for `count` entries that are being made.
fs::path DirectoryToMake(std::uint32_t count) {
  constexpr std::uintmax_t kEnoughForAnEntry = 2000;
  const fs::path memory = "/dev/shm";
  const bool fits =
      fs::is_directory(memory) && fs::space(memory).available > kEnoughForAnEntry * count;
  return (fits ? memory : fs::temp_directory_path()) / "velta-bench-made";
}

}  // namespace

const Query kQueries[2] = {{"getRtcmDatumMessage", AskDatumMessage}, {"get1023", AskGrid}};

Position MiddleOf(const MessageSet& set) {
  return {set.grid.phi0 * velta::kHalfArcSecond, set.grid.lambda0 * velta::kHalfArcSecond};
}

Position GapBehind(std::uint32_t number) {
  constexpr std::int32_t kToEdge = 45;
  const MessageSet set(number);
  return {set.grid.phi0 * velta::kHalfArcSecond,
          (set.grid.lambda0 + kToEdge) * velta::kHalfArcSecond};
}

void MakeDatumFile(const fs::path& path, std::uint32_t first, std::uint32_t count) {
  const fs::path directory = DirectoryToMake(count);
  fs::remove_all(directory);
  {
    velta::RTCMDataSupport support((directory / "").wstring().c_str(), nullptr);
    for (std::uint32_t number = first; number < first + count; ++number) {
      const MessageSet set(number);
      Require(support.ParseDatumMessages(set.datum, &set.grid) == 0, "making a file of entries");
    }
  }
  fs::copy_file(directory / kDatumFile, path, fs::copy_options::overwrite_existing);
  fs::remove_all(directory);
}

std::size_t ValueBytes(const fs::path& path) {
  const orx::TInFileKey file(path.wstring(), nullptr, nullptr, true, 0);
  const orx::TGenericRegistryKey root{orx::TGenericRegistryKeyPtr(file)};
  const std::size_t bytes = ValueBytes(FirstSubKey(FirstSubKey(root)));
  Require(bytes > 0, "looking into an entry");
  return bytes;
}

void Require(bool done, const std::string& what) {
  if (done) return;
  std::fprintf(stderr, "failed: %s\n", what.c_str());
  std::exit(EXIT_FAILURE);
}

}  // namespace velta_bench

// Arbitrary bytes as a registry file: loaded, walked, queried, saved and merged.

#include <cmath>
#include <cstdlib>
#include <cstring>

#include "platform/registry_fixture.h"
#include "record_tree.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t* data, std::size_t size, std::size_t maxSize);

namespace velta_fuzz {
namespace {

using orx::TCSInFileKey;
using orx::cs::velta::RTCMDataSupport;
using orx::cs::velta::RTCMGenerator;
using velta_test::Describe;
using velta_test::RegistryFile;
using velta_test::RootOf;

void Require(bool holds) {
  if (!holds) std::abort();
}

TCSInFileKey Load(const std::filesystem::path& path) {
  return {path.wstring(), nullptr, nullptr, true, orx::kRegistryFlags};
}

/// What is listed is found, and what looks like an area gives a position to ask for.
void Walk(const orx::TGenericRegistryKey& key, std::vector<std::pair<double, double>>& positions) {
  for (const std::wstring& name : key.GetValueNames()) {
    Require(key.HasValue(name) != 0);
    velta_test::RawValue value;
    double area[4];
    if (positions.size() < 3 && key.GetValue(name, value, 0, true) &&
        value.GetByteSize() >= sizeof area) {
      std::memcpy(area, value.GetData(), sizeof area);
      positions.emplace_back(area[0], area[2]);
    }
  }
  for (orx::TGenRegKeyIterator walk(key); walk;) {
    const orx::TGenericRegistryKey sub(walk++);
    Require(key.HasKey(sub.GetName()));
    Walk(sub, positions);
  }
}

void Query(const std::wstring& path, const std::vector<std::pair<double, double>>& positions) {
  const RTCMGenerator generator(1, path, path);
  generator.getAllDatums();
  generator.getRtcmProjMessage();
  for (const auto& [north, east] : positions) {
    generator.getRtcmDatumMessage(north, east, 0);
    generator.get1023(north, east, 0);
    generator.get1024(north, east, 0);
  }
}

/// What was taken for good is good when it is written and read again; what was not is left alone.
void Save(const RegistryFile& file, TCSInFileKey& tree, bool isGood) {
  const std::filesystem::path copy = file.directory / "copy.dff";
  const std::string before = isGood ? Describe(tree) : file.Bytes();
  Require(tree.Save(copy.wstring(), false, orx::kRegistryVersion) == isGood);
  Require(!isGood || Describe(Load(copy)) == before);
  std::filesystem::remove(copy);
  velta_test::Open(RootOf(tree), L"added");
  Require(tree.Save(false, orx::kRegistryVersion) == isGood);
  Require(isGood ? Describe(file.Load()) == Describe(tree) : file.Bytes() == before);
}

/// Merges the file into another one, and that one into the file.
void Merge(const RegistryFile& file, bool isGood) {
  static const RegistryFile other;
  static const std::string before = (other.Create("kept"), other.Bytes());
  other.SetBytes(before);
  const std::wstring path = file.Name();
  const bool merged = RTCMDataSupport::MergeRTCMDatumfiles(other.Name(), path) == 0;
  Require(other.Load().GetErrorState() == orx::kRegistryOk);
  if (!merged) {
    Require(other.Bytes() == before);
    Require(!isGood || !orx::TGenRegKeyIterator(RootOf(file.Load())));
  }
  RTCMDataSupport::MergeRTCMProjectionfiles(path, other.Name());
}

void Try(const std::string& bytes) {
  static const RegistryFile file;
  file.SetBytes(bytes);
  TCSInFileKey tree = file.Load();
  std::vector<std::pair<double, double>> positions{{NAN, 0.15}};
  Walk(RootOf(tree), positions);
  const bool isGood = tree.GetErrorState() == orx::kRegistryOk;
  Query(file.Name(), positions);
  Save(file, tree, isGood);
  if (tree.GetErrorState() != orx::kNotARegistryFile) Merge(file, isGood);
}

}  // namespace
}  // namespace velta_fuzz

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t* data, std::size_t size,
                                               std::size_t maxSize, unsigned seed) {
  if (seed % 4 == 0) return LLVMFuzzerMutate(data, size, maxSize);
  velta_fuzz::Spoiler spoil(seed, &LLVMFuzzerMutate);
  const std::string spoiled = spoil({reinterpret_cast<const char*>(data), size});
  if (spoiled.size() > maxSize) return LLVMFuzzerMutate(data, size, maxSize);
  std::memcpy(data, spoiled.data(), spoiled.size());
  return spoiled.size();
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  velta_fuzz::Try({reinterpret_cast<const char*>(data), size});
  return 0;
}

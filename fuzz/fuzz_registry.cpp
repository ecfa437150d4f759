// Arbitrary bytes as a registry file: loaded, walked, queried, saved and merged.

#include <cmath>
#include <cstdlib>
#include <cstring>

#include "fuzz/record_tree.h"
#include "platform/registry_fixture.h"
#include "support/query_outcomes.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t* data, std::size_t size, std::size_t maxSize);

namespace velta_fuzz {
namespace {

using orx::TCSInFileKey;
using orx::cs::velta::RTCMDataSupport;
using orx::cs::velta::RTCMGenerator;
using velta_test::Describe;
using velta_test::Position;
using velta_test::RegistryFile;
using velta_test::RootOf;

void Require(bool holds) {
  if (!holds) std::abort();
}

TCSInFileKey Load(const std::filesystem::path& path) {
  return {path.wstring(), nullptr, nullptr, true, orx::kRegistryFlags};
}

/// What is listed is found, and what looks like an area gives a position to ask for.
void Walk(const orx::TGenericRegistryKey& key, std::vector<Position>& positions) {
  for (const std::wstring& name : key.GetValueNames()) {
    Require(key.HasValue(name) != 0);
    velta_test::RawValue value;
    double area[4];
    if (positions.size() < 3 && key.GetValue(name, value, 0, true) &&
        value.GetByteSize() >= sizeof area) {
      std::memcpy(area, value.GetData(), sizeof area);
      positions.push_back({area[0], area[2]});
    }
  }
  for (orx::TGenRegKeyIterator walk(key); walk;) {
    const orx::TGenericRegistryKey sub(walk++);
    Require(key.HasKey(sub.GetName()));
    Walk(sub, positions);
  }
}

void Query(const std::wstring& path, const std::vector<Position>& positions) {
  RTCMGenerator(1, path, path).getAllDatums();
  velta_test::Outcomes(path, positions);
}

/// A file that was written here has an index that leads to what is in it.
void CompareIndex(const std::filesystem::path& path, const std::vector<Position>& positions) {
  const std::string bytes = velta_test::ReadBytes(path);
  const std::string outcomes = velta_test::Outcomes(path.wstring(), positions);
  velta_test::WriteBytes(path, velta_test::WithoutIndex(bytes));
  Require(velta_test::Outcomes(path.wstring(), positions) == outcomes);
  velta_test::WriteBytes(path, bytes);
}

/// Adds copies of the first entry, a save each.
void Grow(const std::filesystem::path& path) {
  for (const std::wstring name : {L"copy", L"another"}) {
    TCSInFileKey tree = Load(path);
    const orx::TGenericRegistryKey container(orx::TGenRegKeyIterator(RootOf(tree))++);
    const orx::TGenericRegistryKey entry(orx::TGenRegKeyIterator(container)++);
    if (entry.IsNull()) return;
    velta_test::Open(container, name).DeepCopy(entry);
    Require(tree.Save(false, orx::kRegistryVersion));
  }
}

/// What was taken for good is good when it is written and read again; what was not is left alone.
void Save(const RegistryFile& file, TCSInFileKey& tree, bool isGood,
          const std::vector<Position>& positions) {
  const std::filesystem::path copy = file.directory / "copy.dff";
  const std::string before = isGood ? Describe(tree) : file.Bytes();
  Require(tree.Save(copy.wstring(), false, orx::kRegistryVersion) == isGood);
  Require(!isGood || Describe(Load(copy)) == before);
  if (isGood) {
    Grow(copy);
    CompareIndex(copy, positions);
  }
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
  std::vector<Position> positions{{NAN, 0.15}};
  Walk(RootOf(tree), positions);
  const bool isGood = tree.GetErrorState() == orx::kRegistryOk;
  Query(file.Name(), positions);
  Save(file, tree, isGood, positions);
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

// Arbitrary bytes as a registry file: loaded, walked, queried and merged.

#include <cmath>
#include <cstdlib>
#include <cstring>

#include "orxregistry/in_file_key.h"
#include "scratch_directory.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace velta_fuzz {
namespace {

namespace velta = orx::cs::velta;

void AppendChecksum(std::string& to, const char* bytes, std::size_t size, std::uint64_t seed = 0) {
  const std::uint64_t checksum = XXH3_64bits_withSeed(bytes, size, seed);
  to.append(reinterpret_cast<const char*>(&checksum), sizeof checksum);
}

void AppendSegment(std::string& file, std::string_view tree) {
  const std::size_t at = file.size();
  const std::uint64_t sizes[] = {0x31474553, tree.size(), 0};  // the mark, the tree, superseded
  file.append(reinterpret_cast<const char*>(sizes), sizeof sizes);
  AppendChecksum(file, tree.data(), tree.size());
  AppendChecksum(file, std::string(file, at).data(), file.size() - at, at);
  file.append(tree);
}

/// Right checksums around the input, so that it is the records that are tried. A byte 0xFE followed
/// by another divides segments.
std::string Wrap(std::string_view input) {
  std::string file("\x89ORX\r\n\x1A\n\0\2\0\0\0\0\0\0", 16);
  AppendChecksum(file, std::string(file).data(), file.size());
  for (;;) {
    const std::size_t end = input.find("\xFE\xFE");
    AppendSegment(file, input.substr(0, end));
    if (end == input.npos) return file;
    input.remove_prefix(end + 2);
  }
}

std::size_t Walk(const orx::TGenericRegistryKey& key) {
  std::size_t seen = 1;
  for (const std::wstring& name : key.GetValueNames()) {
    seen += key.GetValueSize(name) + orx::GetRegValue<std::wstring>(key, name, L"", 0).size();
  }
  for (orx::TGenRegKeyIterator walk(key); walk;) seen += Walk(orx::TGenericRegistryKey(walk++));
  return seen;
}

void Query(const std::wstring& path) {
  const velta::RTCMGenerator generator(1, path, path);
  for (const double at : {0.0, 0.9, NAN}) {
    generator.getRtcmDatumMessage(at, 0.15, 0);
    generator.get1023(at, 0.15, 0);
    generator.get1024(at * 5e6, 3.5e6, 0);
  }
  generator.getRtcmProjMessage();
  generator.getAllDatums();
}

void Try(const std::string& bytes) {
  static const ScratchDirectory directory;
  directory.Empty();
  const std::wstring path = (directory / "input.dff").wstring();
  const std::wstring other = (directory / "other.dff").wstring();
  WriteFile(directory / "input.dff", bytes);
  orx::TCSInFileKey tree(path, nullptr, nullptr, true, 97);
  Walk(orx::TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree)));
  tree.Save(other, false, orx::kRegistryVersion);
  if (tree.GetErrorState() == orx::kRegistryOk) {
    // What was taken for good must be good when it is written and read again.
    const orx::TCSInFileKey again(other, nullptr, nullptr, true, 97);
    const auto size = [](const orx::TCSInFileKey& t) {
      return Walk(orx::TGenericRegistryKey(orx::TGenericRegistryKeyPtr(t)));
    };
    if (again.GetErrorState() != orx::kRegistryOk || size(again) != size(tree)) std::abort();
  }
  Query(path);
  const velta::RTCMDataSupport unloadsTheSharedFiles(L"", L"");
  velta::RTCMDataSupport::MergeRTCMDatumfiles(other, path);
  velta::RTCMDataSupport::MergeRTCMProjectionfiles(path, other);
}

}  // namespace
}  // namespace velta_fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size == 0) return 0;
  const std::string_view input(reinterpret_cast<const char*>(data) + 1, size - 1);
  velta_fuzz::Try(data[0] % 4 == 0 ? std::string(input) : velta_fuzz::Wrap(input));
  return 0;
}

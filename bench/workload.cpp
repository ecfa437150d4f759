#include "workload.h"

#include <cstdio>
#include <cstdlib>

#include "velta/message_units.h"

namespace velta_bench {
namespace fs = std::filesystem;
namespace velta = orx::cs::velta;

Position MiddleOf(const MessageSet& set) {
  return {set.grid.phi0 * velta::kHalfArcSecond, set.grid.lambda0 * velta::kHalfArcSecond};
}

void MakeDatumFile(const fs::path& path, std::uint32_t first, std::uint32_t count) {
  const fs::path memory = "/dev/shm";
  const fs::path directory =
      (fs::is_directory(memory) ? memory : fs::temp_directory_path()) / "velta-bench-made";
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

void Require(bool done, const std::string& what) {
  if (done) return;
  std::fprintf(stderr, "failed: %s\n", what.c_str());
  std::exit(EXIT_FAILURE);
}

}  // namespace velta_bench

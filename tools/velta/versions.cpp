#include "versions.h"

#include <xxhash.h>

#include <CLI/Version.hpp>
#include <nlohmann/json.hpp>

#include "rtcm3/version.h"
#include "velta/version.h"

namespace velta_tool {

std::string Numbers(int major, int minor, int patch) {
  return std::to_string(major) + '.' + std::to_string(minor) + '.' + std::to_string(patch);
}

std::string Versions() {
  return "velta " VELTA_VERSION "\nlibvelta " + std::string(orx::cs::velta::LibraryVersion()) +
         ", velta-rtcm3 " + orx::cs::velta::rtcm3::CodecVersion() + '\n' + ProjVersions() +
         "\nbuilt with xxHash " +
         Numbers(XXH_VERSION_MAJOR, XXH_VERSION_MINOR, XXH_VERSION_RELEASE) + ", nlohmann-json " +
         Numbers(NLOHMANN_JSON_VERSION_MAJOR, NLOHMANN_JSON_VERSION_MINOR,
                 NLOHMANN_JSON_VERSION_PATCH) +
         ", CLI11 " CLI11_VERSION;
}

}  // namespace velta_tool

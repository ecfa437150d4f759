#include "rtcm3/version.h"

namespace orx::cs::velta::rtcm3 {

const char* CodecVersion() noexcept { return VELTA_VERSION; }

}  // namespace orx::cs::velta::rtcm3

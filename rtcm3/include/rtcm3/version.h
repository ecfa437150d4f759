#pragma once

#include "rtcm3/export.h"

namespace orx::cs::velta::rtcm3 {

/// The version of the codec library that is loaded, such as "1.0.0"; belongs to the library.
VELTA_RTCM3_EXPORT const char* CodecVersion() noexcept;

}  // namespace orx::cs::velta::rtcm3

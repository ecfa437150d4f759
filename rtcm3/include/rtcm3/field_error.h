#pragma once

#include <stdexcept>

#include "rtcm3/export.h"

namespace orx::cs::velta::rtcm3 {

/// A field holds, or is given, what the message cannot carry; the text names the field and its
/// range.
struct VELTA_RTCM3_EXPORT FieldError : std::runtime_error {
  using std::runtime_error::runtime_error;
  FieldError(const FieldError&) = default;
  ~FieldError() override;
};

}  // namespace orx::cs::velta::rtcm3

#include "rtcm3/field_error.h"

namespace orx::cs::velta::rtcm3 {

// Here, so that there is one type description of it for all who throw and catch it.
FieldError::~FieldError() = default;

}  // namespace orx::cs::velta::rtcm3

#pragma once

#include "velta/export.h"

namespace orx::cs::velta {

/// The version of the library that is loaded, such as "1.0.0"; belongs to the library.
VELTA_EXPORT const char* LibraryVersion() noexcept;

}  // namespace orx::cs::velta

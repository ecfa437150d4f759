#include "velta/version.h"

namespace orx::cs::velta {

const char* LibraryVersion() noexcept { return VELTA_VERSION; }

}  // namespace orx::cs::velta

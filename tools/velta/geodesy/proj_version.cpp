#include <proj.h>

#include "versions.h"

namespace velta_tool {

std::string ProjVersion() { return std::string("PROJ ") + proj_info().version; }

}  // namespace velta_tool

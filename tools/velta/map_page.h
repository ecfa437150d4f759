#pragma once

#include <string_view>

namespace velta_tool {

/// The page of "velta map" with kMapData where its data go. Its source is the folder "map".
extern const std::string_view kMapPage;
inline constexpr std::string_view kMapData = "{{data}}";

}  // namespace velta_tool

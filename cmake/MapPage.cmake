# Puts the page of "velta map" together from its pieces in tools/velta/map: style and script go into
# it, so that it needs no other file, and it becomes a constant of the program.
#
#   map_page   the source file that defines it

set(pieces ${PROJECT_SOURCE_DIR}/tools/velta/map)
set(scripts sheets.js projections.js symbols.js graticule.js drawing.js legend.js details.js
            moving.js page.js)

set(script)
foreach(name ${scripts})
  file(READ ${pieces}/${name} piece)
  string(APPEND script "${piece}")
endforeach()
file(READ ${pieces}/style.css style)
file(READ ${pieces}/page.html page)
string(CONFIGURE "${page}" page @ONLY)

set(map_page ${CMAKE_BINARY_DIR}/map_page.cpp)
file(CONFIGURE OUTPUT ${map_page} @ONLY CONTENT [[
#include "map_page.h"

const std::string_view velta_tool::kMapPage = R"page(@page@)page";
]])
list(TRANSFORM scripts PREPEND ${pieces}/)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS
             ${scripts} ${pieces}/style.css ${pieces}/page.html)

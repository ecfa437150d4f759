# Toolchain: cross compilation for 64-bit Windows with mingw-w64 (posix threads), run under Wine.
# Builds this project, and others against its package, of which it then is a part.

set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)
set(CMAKE_C_COMPILER x86_64-w64-mingw32-gcc-posix)
set(CMAKE_CXX_COMPILER x86_64-w64-mingw32-g++-posix)
set(CMAKE_RC_COMPILER x86_64-w64-mingw32-windres)
if(EXISTS ${CMAKE_CURRENT_LIST_DIR}/../scripts/wine)
  set(CMAKE_CROSSCOMPILING_EMULATOR ${CMAKE_CURRENT_LIST_DIR}/../scripts/wine)
endif()

# The header-only packages of this machine, and nothing else of its /usr/include: the headers of
# its own C library must not be seen. Package files are copied, as they would find their way back
# through a link.
set(host_packages ${CMAKE_BINARY_DIR}/host-packages)
if(NOT EXISTS ${host_packages})
  file(MAKE_DIRECTORY ${host_packages}/include)
  foreach(header boost CLI nlohmann xxhash.h)
    file(CREATE_LINK /usr/include/${header} ${host_packages}/include/${header} SYMBOLIC)
  endforeach()
  foreach(package CLI11 nlohmann_json)
    if(EXISTS /usr/share/cmake/${package})
      file(COPY /usr/share/cmake/${package} DESTINATION ${host_packages}/share/cmake)
    endif()
  endforeach()
endif()
include_directories(SYSTEM ${host_packages}/include)

set(CMAKE_FIND_ROOT_PATH ${host_packages} /usr/x86_64-w64-mingw32)
if(EXISTS ${CMAKE_CURRENT_LIST_DIR}/veltaConfig.cmake)
  get_filename_component(package_prefix ${CMAKE_CURRENT_LIST_DIR}/../../.. ABSOLUTE)
  list(PREPEND CMAKE_FIND_ROOT_PATH ${package_prefix})
endif()
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

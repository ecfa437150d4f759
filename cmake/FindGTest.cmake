# GoogleTest: the installed library or, when building for another system, one made of the sources
# that the distribution ships.

set(sources /usr/src/googletest/googletest)
if(NOT TARGET GTest::gtest)
  find_package(GTest CONFIG QUIET)
endif()
if(NOT TARGET GTest::gtest AND EXISTS ${sources})
  add_subdirectory(${sources} ${CMAKE_BINARY_DIR}/googletest EXCLUDE_FROM_ALL SYSTEM)
  foreach(target gtest gtest_main)
    target_compile_options(${target} PRIVATE -w)
    set_target_properties(${target} PROPERTIES CXX_EXTENSIONS ON)
  endforeach()
endif()

if(TARGET GTest::gtest)
  set(GTest_FOUND TRUE)
endif()
include(FindPackageHandleStandardArgs)
find_package_handle_standard_args(GTest REQUIRED_VARS GTest_FOUND)

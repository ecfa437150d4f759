# What every target of this project is compiled with.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)

# Products are rounded one by one, so that every machine gets the same bits.
add_compile_options(-ffp-contract=off)
add_compile_options(-Wall -Wextra -Wpedantic -Wconversion -Wsign-conversion -Wshadow
                    -Wnon-virtual-dtor -Woverloaded-virtual -Wcast-qual)
if(VELTA_WERROR)
  add_compile_options(-Werror)
endif()
# g++ 12 takes copies inside std::string for overlapping ones when it optimises.
add_compile_options($<$<CXX_COMPILER_ID:GNU>:-Wno-restrict>)
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
  # Warns of copies that a test in front of them rules out.
  add_compile_options(-Wno-array-bounds -Wno-stringop-overread)
endif()

# What is read comes from outside, and is read by other people's programs: an overrun ends the
# program before it can be used. Windows has the rest of it unasked.
add_compile_options(-fstack-protector-strong)
if(WIN32)
  # In each module, as it would be one more library of the runtime.
  string(APPEND CMAKE_CXX_STANDARD_LIBRARIES " -l:libssp.a")
else()
  include(CheckCXXCompilerFlag)
  include(CheckPIESupported)
  check_pie_supported()
  foreach(flag -fstack-clash-protection -fcf-protection)
    check_cxx_compiler_flag(${flag} has${flag})
    add_compile_options($<$<BOOL:${has${flag}}>:${flag}>)
  endforeach()
  add_link_options(LINKER:-z,relro,-z,now,-z,noexecstack)
endif()

# Boost: headers only.
add_compile_definitions(BOOST_ALL_NO_LIB BOOST_DLL_USE_STD_FS)

set(VELTA_SANITIZE "" CACHE STRING "Sanitizers, as -fsanitize= takes them")
if(VELTA_SANITIZE)
  add_compile_options(-fsanitize=${VELTA_SANITIZE} -fno-sanitize-recover=all
                      -fno-omit-frame-pointer)
  add_link_options(-fsanitize=${VELTA_SANITIZE})
else()
  # The sanitizers see more than this, and it needs an optimising compiler.
  add_compile_options($<$<CONFIG:Release,RelWithDebInfo>:-U_FORTIFY_SOURCE>
                      $<$<CONFIG:Release,RelWithDebInfo>:-D_FORTIFY_SOURCE=3>)
endif()

find_program(CCACHE ccache)
if(CCACHE AND NOT CMAKE_CXX_COMPILER_LAUNCHER)
  set(CMAKE_CXX_COMPILER_LAUNCHER ${CCACHE})
endif()

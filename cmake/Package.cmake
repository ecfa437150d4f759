# The packages that cpack makes: for Linux one archive with everything and a Debian package for each
# part, for Windows one archive.

set(CPACK_PACKAGE_VENDOR velta)
set(CPACK_PACKAGE_CONTACT "The velta developers <velta@localhost>")
set(CPACK_PACKAGE_DIRECTORY ${CMAKE_BINARY_DIR}/packages)
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "${PROJECT_DESCRIPTION}")
set(CPACK_STRIP_FILES ON)
set(CPACK_THREADS 0)

if(WIN32)
  set(CPACK_GENERATOR ZIP)
else()
  set(CPACK_SYSTEM_NAME linux-${CMAKE_SYSTEM_PROCESSOR})
  set(CPACK_GENERATOR TGZ DEB)
  set(CPACK_DEB_COMPONENT_INSTALL ON)
  set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
  # What the libraries need of the system, and the program of the libraries, is read from them.
  set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
  set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
  set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${CMAKE_LIBRARY_OUTPUT_DIRECTORY})
  set(CPACK_DEBIAN_ENABLE_COMPONENT_DEPENDS ON)

  set(library lib${PROJECT_NAME}${PROJECT_VERSION_MAJOR})
  set(CPACK_DEBIAN_LIBRARY_PACKAGE_NAME ${library})
  set(CPACK_DEBIAN_LIBRARY_PACKAGE_SECTION libs)
  set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME lib${PROJECT_NAME}-dev)
  set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
  # The public headers use Boost's shared pointer and recursive mutex.
  set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS
      "${library} (= ${PROJECT_VERSION}), libboost-dev (>= 1.74)")
  set(CPACK_DEBIAN_PROGRAM_PACKAGE_NAME ${PROJECT_NAME})
  set(CPACK_DEBIAN_PROGRAM_PACKAGE_SECTION science)
  set(CPACK_DEBIAN_PROGRAM_PACKAGE_DEPENDS "${library} (= ${PROJECT_VERSION})")
  set(CPACK_COMPONENT_LIBRARY_DESCRIPTION "What a program that uses the library needs to run.")
  set(CPACK_COMPONENT_DEVELOPMENT_DESCRIPTION "Headers and CMake package of the library.")
  set(CPACK_COMPONENT_PROGRAM_DESCRIPTION
      "Reads RTCM 3 streams into datum and projection files, shows them, writes RTCM 3 frames.")
endif()
set(CPACK_COMPONENTS_ALL library development program)
include(CPack)

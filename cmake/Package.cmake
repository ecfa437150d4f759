# The packages that cpack makes: for Linux one archive with everything and a Debian package for each
# part, for Windows one archive.

set(CPACK_PACKAGE_VENDOR velta)
# An address that cannot exist, until the owner of the project names one.
set(CPACK_PACKAGE_CONTACT "The velta developers <velta@velta.example>")
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
  # Its libraries become known to the system without a run of ldconfig for each package.
  file(WRITE ${CMAKE_BINARY_DIR}/debian/triggers "activate-noawait ldconfig\n")
  set(CPACK_DEBIAN_LIBRARY_PACKAGE_CONTROL_EXTRA ${CMAKE_BINARY_DIR}/debian/triggers)

  # The version's section of the changelog, as Debian writes it.
  file(READ CHANGELOG.md changes)
  string(REGEX REPLACE ".*\n## ${PROJECT_VERSION}\n\n" "\n" changes "${changes}")
  string(REGEX REPLACE "\n## .*" "" changes "${changes}")
  string(REGEX REPLACE "\n([^\n])" "\n  \\1" changes "${changes}")
  string(REPLACE "\n  - " "\n  * " changes "${changes}")
  string(TIMESTAMP now "%a, %d %b %Y %H:%M:%S +0000" UTC)
  file(WRITE ${CMAKE_BINARY_DIR}/debian/changelog
       "${PROJECT_NAME} (${PROJECT_VERSION}) stable; urgency=medium\n${changes}\n"
       " -- ${CPACK_PACKAGE_CONTACT}  ${now}\n")
  file(ARCHIVE_CREATE OUTPUT ${CMAKE_BINARY_DIR}/debian/changelog.gz
       PATHS ${CMAKE_BINARY_DIR}/debian/changelog
       FORMAT raw COMPRESSION GZip COMPRESSION_LEVEL 9)
  foreach(component library development program)
    string(TOUPPER ${component} part)
    # Not in the archive, where all would be the same.
    install(FILES cmake/copyright ${CMAKE_BINARY_DIR}/debian/changelog.gz
            DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/${CPACK_DEBIAN_${part}_PACKAGE_NAME}
            COMPONENT ${component} EXCLUDE_FROM_ALL)
  endforeach()

  set(CPACK_COMPONENT_LIBRARY_DESCRIPTION "What a program that uses the library needs to run.")
  set(CPACK_COMPONENT_DEVELOPMENT_DESCRIPTION "Headers, CMake package and pkg-config files of the library.")
  set(CPACK_COMPONENT_PROGRAM_DESCRIPTION
      "Reads RTCM 3 streams into datum and projection files and writes RTCM 3 frames.")
endif()
set(CPACK_COMPONENTS_ALL library development program)
include(CPack)

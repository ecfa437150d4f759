# What "cmake --install" lays down: the libraries, the program, and the package that other projects
# find with find_package(velta CONFIG). The tree can be moved as a whole. In parts: "library" is
# what a program needs to run, "development" what it needs besides to be built, and "program" the
# companion program.

include(CMakePackageConfigHelpers)

set(platform_libraries orxutils userdirs projmath orxregistry)
set(package_directory ${CMAKE_INSTALL_LIBDIR}/cmake/velta)
set(velta_libraries velta velta-rtcm3)
set_target_properties(${platform_libraries} ${velta_libraries} PROPERTIES
  INSTALL_RPATH "$ORIGIN"
  VERSION ${PROJECT_VERSION}
  SOVERSION ${PROJECT_VERSION_MAJOR})

foreach(export orx velta)
  set(targets ${velta_libraries})
  if(export STREQUAL orx)
    set(targets ${platform_libraries})
  endif()
  install(TARGETS ${targets} EXPORT ${export}Targets
          RUNTIME COMPONENT library
          LIBRARY COMPONENT library NAMELINK_COMPONENT development
          ARCHIVE COMPONENT development)
  install(EXPORT ${export}Targets NAMESPACE ${export}:: DESTINATION ${package_directory}
          COMPONENT development)
endforeach()
# Found at run time: on Windows beside the library that asks for it, elsewhere in a directory of this
# release, as its name has no version and the libraries of another release may lie beside these.
set(module_directory velta/${PROJECT_VERSION_MAJOR})
target_compile_definitions(orxutils PRIVATE ORXUTILS_MODULE_DIRECTORY="${module_directory}")
set_target_properties(RTCMGridHost PROPERTIES INSTALL_RPATH "$ORIGIN/../..")
install(TARGETS RTCMGridHost COMPONENT library
        LIBRARY DESTINATION $<IF:$<BOOL:${WIN32}>,${CMAKE_INSTALL_BINDIR},${CMAKE_INSTALL_LIBDIR}/${module_directory}>)

install(TARGETS velta-tool EXPORT veltaProgramTargets RUNTIME COMPONENT program)
if(TARGET manual)
  install(DIRECTORY ${CMAKE_BINARY_DIR}/tools/manual/share/ DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}
          COMPONENT program)
endif()
install(EXPORT veltaProgramTargets NAMESPACE velta:: DESTINATION ${package_directory}
        COMPONENT program)

install(DIRECTORY include/ rtcm3/include/ TYPE INCLUDE COMPONENT development)
foreach(library ${platform_libraries})
  install(DIRECTORY platform/${library}/include/ TYPE INCLUDE COMPONENT development)
endforeach()
configure_package_config_file(cmake/veltaConfig.cmake.in ${CMAKE_BINARY_DIR}/veltaConfig.cmake
                              INSTALL_DESTINATION ${package_directory}
                              PATH_VARS CMAKE_INSTALL_BINDIR)
write_basic_package_version_file(${CMAKE_BINARY_DIR}/veltaConfigVersion.cmake
                                 COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_BINARY_DIR}/veltaConfig.cmake ${CMAKE_BINARY_DIR}/veltaConfigVersion.cmake
        DESTINATION ${package_directory} COMPONENT development)

# For who builds without CMake, where that is usual.
if(NOT WIN32)
  set(pkgconfig_directory ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
  file(RELATIVE_PATH prefix_from_here /${pkgconfig_directory} /)
  foreach(library ${velta_libraries})
    configure_file(cmake/${library}.pc.in ${CMAKE_BINARY_DIR}/${library}.pc @ONLY)
    install(FILES ${CMAKE_BINARY_DIR}/${library}.pc DESTINATION ${pkgconfig_directory}
            COMPONENT development)
  endforeach()
endif()

install(FILES cmake/copyright DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT program)
install(FILES README.md CHANGELOG.md CONTRIBUTING.md DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT development)
install(DIRECTORY docs DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT development
        FILES_MATCHING PATTERN *.md)
install(FILES examples/library_usage.cpp DESTINATION ${CMAKE_INSTALL_DOCDIR}/examples
        COMPONENT development)
install(DIRECTORY examples/outside DESTINATION ${CMAKE_INSTALL_DOCDIR}/examples
        COMPONENT development)
install(DIRECTORY examples/streams DESTINATION ${CMAKE_INSTALL_DOCDIR}/examples COMPONENT program)
install(FILES examples/positions.txt DESTINATION ${CMAKE_INSTALL_DOCDIR}/examples COMPONENT program)

# What "cmake --install" lays down: the libraries, the program, and the package that other projects
# find with find_package(velta CONFIG). The tree can be moved as a whole.

include(CMakePackageConfigHelpers)

set(platform_libraries orxutils userdirs projmath orxregistry)
set_target_properties(${platform_libraries} velta RTCMGridHost PROPERTIES INSTALL_RPATH "$ORIGIN")
install(TARGETS ${platform_libraries} EXPORT orxTargets)
install(TARGETS velta EXPORT veltaTargets)
# Found at run time beside the library that asks for it.
install(TARGETS RTCMGridHost
        LIBRARY DESTINATION $<IF:$<BOOL:${WIN32}>,${CMAKE_INSTALL_BINDIR},${CMAKE_INSTALL_LIBDIR}>)

install(DIRECTORY include/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
foreach(library ${platform_libraries})
  install(DIRECTORY platform/${library}/include/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
endforeach()

set(package_directory ${CMAKE_INSTALL_LIBDIR}/cmake/velta)
install(EXPORT orxTargets NAMESPACE orx:: DESTINATION ${package_directory})
install(EXPORT veltaTargets NAMESPACE velta:: DESTINATION ${package_directory})
write_basic_package_version_file(${CMAKE_BINARY_DIR}/veltaConfigVersion.cmake
                                 COMPATIBILITY SameMajorVersion)
install(FILES cmake/veltaConfig.cmake ${CMAKE_BINARY_DIR}/veltaConfigVersion.cmake
        DESTINATION ${package_directory})

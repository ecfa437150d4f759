# What Windows wants differently.

# "orxutils.dll", as the other users of the libraries know it, not "liborxutils.dll".
set(CMAKE_SHARED_LIBRARY_PREFIX "")
set(CMAKE_SHARED_MODULE_PREFIX "")

# Objects and exceptions cross the libraries, so that all of them share one C++ runtime. Programs
# look for it beside themselves.
set(runtime_files)
foreach(name libstdc++-6.dll libgcc_s_seh-1.dll libwinpthread-1.dll)
  execute_process(COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=${name}
                  OUTPUT_VARIABLE file OUTPUT_STRIP_TRAILING_WHITESPACE)
  file(COPY ${file} DESTINATION ${CMAKE_RUNTIME_OUTPUT_DIRECTORY})
  list(APPEND runtime_files ${CMAKE_RUNTIME_OUTPUT_DIRECTORY}/${name})
endforeach()
# Nine tenths of it are for a debugger.
execute_process(COMMAND ${CMAKE_STRIP} --strip-unneeded ${runtime_files})
install(FILES ${runtime_files} DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT library)
# For who builds against the package where this was built.
install(FILES cmake/mingw-w64.cmake DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/velta
        COMPONENT development)

# add_skipped_test(NAME REASON): stands for tests that cannot run here, and says why.
function(add_skipped_test name reason)
  add_test(NAME ${name} COMMAND ${CMAKE_COMMAND} -E echo "${name}: Skipped\n${reason}")
  set_tests_properties(${name} PROPERTIES SKIP_REGULAR_EXPRESSION ": Skipped")
endfunction()

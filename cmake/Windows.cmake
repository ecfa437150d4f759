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
  list(APPEND runtime_files ${file})
endforeach()
file(COPY ${runtime_files} DESTINATION ${CMAKE_RUNTIME_OUTPUT_DIRECTORY})
install(FILES ${runtime_files} DESTINATION ${CMAKE_INSTALL_BINDIR})

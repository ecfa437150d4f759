# set_exports(TARGET [PATTERNS]): of what the sources of a library mark as exported, only names of
# this project leave it. Templates of other libraries, which the compiler instantiates in it and
# takes for exported, stay inside. The linker for Windows exports only what is marked anyway.
function(set_exports target)
  if(WIN32)
    return()
  endif()
  set(patterns ${ARGN})
  if(NOT patterns)
    # Functions, data, virtual tables and type descriptions of namespace orx, as they are mangled.
    set(patterns _ZN3orx* _ZNK3orx* _ZT?N3orx*)
  endif()
  set(script ${CMAKE_CURRENT_BINARY_DIR}/${target}.map)
  file(CONFIGURE OUTPUT ${script} CONTENT "{ global: @patterns@; local: *; };\n" @ONLY)
  target_link_options(${target} PRIVATE LINKER:--version-script=${script})
  set_property(TARGET ${target} APPEND PROPERTY LINK_DEPENDS ${script})
endfunction()

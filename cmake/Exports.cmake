# The library's flat export surface, written once in src/tekit.exports (one undecorated name a
# line, '#' comments) and applied to the `tekit` target:
#
#   Linux    a version script: the listed names, plus every C++ symbol (_Z*), which hidden
#            visibility and TEKIT_API already narrow to the exported classes; nothing else
#   Windows  a .def file of the listed names, linked into the DLL. On i686 the flat functions
#            use the standard call: --enable-stdcall-fixup binds "Foo" to "_Foo@8" quietly and
#            --kill-at (cmake/MinGW.cmake) drops the decoration from the export table.
#
# A listed name the library does not define fails the Windows link; the `library_exports` test
# compares what each built library exports with the list.
# Included by the top-level CMakeLists.txt once the `tekit` target exists.

set(TEKIT_EXPORTS_LIST ${PROJECT_SOURCE_DIR}/src/tekit.exports)
set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS
             ${TEKIT_EXPORTS_LIST})

# The names of the list, checked: identifiers only, each once.
function(tekit_read_export_list out)
  file(STRINGS ${TEKIT_EXPORTS_LIST} _lines)
  set(_names)
  foreach(_line IN LISTS _lines)
    string(STRIP "${_line}" _line)
    if(_line STREQUAL "" OR _line MATCHES "^#")
      continue()
    endif()
    if(NOT _line MATCHES "^[A-Za-z_][A-Za-z0-9_]*$")
      message(FATAL_ERROR "${TEKIT_EXPORTS_LIST}: \"${_line}\" is not a plain C name")
    endif()
    if(_line IN_LIST _names)
      message(FATAL_ERROR "${TEKIT_EXPORTS_LIST}: ${_line} is listed twice")
    endif()
    list(APPEND _names ${_line})
  endforeach()
  set(${out} ${_names} PARENT_SCOPE)
endfunction()

function(tekit_apply_export_list target)
  tekit_read_export_list(_names)
  if(WIN32)
    set(_file ${CMAKE_CURRENT_BINARY_DIR}/${target}.def)
    list(JOIN _names "\n    " _entries)
    file(CONFIGURE OUTPUT ${_file} @ONLY
         CONTENT "; Generated from src/tekit.exports: the flat interface.\nEXPORTS\n    @_entries@\n")
    target_sources(${target} PRIVATE ${_file})
    if(CMAKE_SIZEOF_VOID_P EQUAL 4)
      target_link_options(${target} PRIVATE -Wl,--enable-stdcall-fixup)
    endif()
  else()
    set(_file ${CMAKE_CURRENT_BINARY_DIR}/${target}.map)
    list(JOIN _names ";\n    " _entries)
    file(CONFIGURE OUTPUT ${_file} @ONLY
         CONTENT "/* Generated from src/tekit.exports: the flat interface, and C++ symbols. */
{
  global:
    @_entries@;
    _Z*;
  local:
    *;
};
")
    target_link_options(${target} PRIVATE -Wl,--version-script=${_file})
    set_property(TARGET ${target} APPEND PROPERTY LINK_DEPENDS ${_file})
  endif()
endfunction()

tekit_apply_export_list(tekit)

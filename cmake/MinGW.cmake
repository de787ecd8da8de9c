# Windows builds with MinGW-w64: where outputs land, what the DLL links, how tests run.
# Included by the top-level CMakeLists.txt before the library target is created.

# One folder for the DLL, its runtime DLLs and every test program: Windows looks for a program's
# DLLs beside it, so the tests find tekit.dll (and tekit.dll finds kazlibwapi.dll) with no PATH.
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/bin)

# Cross builds run their programs under Wine, in a prefix of their own inside the build folder.
if(CMAKE_CROSSCOMPILING)
  set(TEKIT_WINEPREFIX ${CMAKE_BINARY_DIR}/wineprefix CACHE PATH "Wine prefix for the tests")
  set(CMAKE_CROSSCOMPILING_EMULATOR ${PROJECT_SOURCE_DIR}/scripts/wine-run.sh ${TEKIT_WINEPREFIX})
endif()

# Links the Windows-only parts of the library once the target exists.
function(tekit_configure_mingw_library target)
  # _bstr_t, BSTR and COM error information live in the OLE libraries; callers that use the
  # _bstr_t overloads inline need them too, so they are part of the interface.
  target_link_libraries(${target} PUBLIC ole32 oleaut32 uuid)
  if(CMAKE_SIZEOF_VOID_P EQUAL 4)
    # Flat functions use the standard call on 32-bit Windows; --kill-at exports them as "Foo"
    # instead of "Foo@8", the names callers look up with GetProcAddress. The import library is
    # rebuilt from the linker's record of every export (the C++ ones too), decorated again from
    # the DLL's symbol table so that callers compiled against the headers find "_Foo@8".
    set(_linked_def ${CMAKE_CURRENT_BINARY_DIR}/${target}-linked.def)
    target_link_options(${target} PRIVATE -Wl,--kill-at -Wl,--output-def,${_linked_def})
    add_custom_command(TARGET ${target} POST_BUILD
                       COMMAND ${CMAKE_COMMAND} -DDEF=${_linked_def} -DDLLTOOL=${CMAKE_DLLTOOL}
                               -DNM=${CMAKE_NM} -DDLL=$<TARGET_FILE:${target}>
                               -DDLL_NAME=$<TARGET_FILE_NAME:${target}>
                               -DIMPLIB=$<TARGET_LINKER_FILE:${target}>
                               -P ${CMAKE_CURRENT_FUNCTION_LIST_DIR}/MinGWImportLibrary.cmake
                       VERBATIM)
  endif()
  tekit_copy_mingw_runtime(${target})
endfunction()

# The compiler's runtime DLLs (libstdc++, libgcc, winpthread) are linked dynamically and copied
# beside the outputs. One shared libstdc++ serves the DLL and its callers, which exchange C++
# objects; and on i686 (DWARF-2 unwinding) an exception thrown in the DLL can only be caught in
# the caller when both use the one shared libgcc.
function(tekit_copy_mingw_runtime target)
  if(CMAKE_SIZEOF_VOID_P EQUAL 4)
    set(_libgcc libgcc_s_dw2-1.dll)
  else()
    set(_libgcc libgcc_s_seh-1.dll)
  endif()
  set(_dlls)
  foreach(_name libstdc++-6.dll ${_libgcc} libwinpthread-1.dll)
    execute_process(COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=${_name}
                    OUTPUT_VARIABLE _path OUTPUT_STRIP_TRAILING_WHITESPACE)
    if(NOT IS_ABSOLUTE "${_path}" OR NOT EXISTS "${_path}")
      message(FATAL_ERROR "MinGW runtime ${_name} not found by ${CMAKE_CXX_COMPILER}")
    endif()
    list(APPEND _dlls ${_path})
  endforeach()
  add_custom_command(TARGET ${target} POST_BUILD
                     COMMAND ${CMAKE_COMMAND} -E copy_if_different ${_dlls}
                             ${CMAKE_RUNTIME_OUTPUT_DIRECTORY}
                     VERBATIM)
  install(FILES ${_dlls} DESTINATION ${CMAKE_INSTALL_BINDIR})
endfunction()

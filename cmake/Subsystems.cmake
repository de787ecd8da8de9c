# One CMake library per subsystem folder, all linked into the one shared libtekit.
#
#   tekit_add_subsystem(strings
#     SOURCES   CopyOnWrite.cpp DynamicString.cpp ...        # explicit: no globbing
#     DEPENDS   platform errors                              # subsystems it builds on
#     WIN32_SOURCES StringVector_win32.cpp ...                # COM and Win32-only parts
#     POSIX_SOURCES ...                                       # their stand-ins elsewhere
#     LIBRARIES ${CMAKE_DL_LIBS})                            # system libraries it needs
#
# Each subsystem is an OBJECT library `tekit_<name>`: its objects go into the shared library
# and, through `tekit_internal`, into the unit tests, which so reach internal headers and the
# platform's fault seam without compiling a file of src/ again. Which subsystem may include
# which is written once, in TEKIT_LAYERS (top-level CMakeLists.txt), and checked by the
# `layering` test.

# Everything the subsystems' objects make up, as a static library for the unit tests. Tests
# compile with TEKIT_STATIC, so the public headers declare nothing as imported from a DLL.
add_library(tekit_internal STATIC)
target_compile_definitions(tekit_internal INTERFACE TEKIT_STATIC)
target_include_directories(tekit_internal INTERFACE ${PROJECT_SOURCE_DIR}/include
                                                    ${PROJECT_SOURCE_DIR}/src)
target_compile_features(tekit_internal INTERFACE cxx_std_20)

function(tekit_add_subsystem name)
  cmake_parse_arguments(arg "" "" "SOURCES;WIN32_SOURCES;POSIX_SOURCES;DEPENDS;LIBRARIES" ${ARGN})
  if(WIN32)
    list(APPEND arg_SOURCES ${arg_WIN32_SOURCES})
  else()
    list(APPEND arg_SOURCES ${arg_POSIX_SOURCES})
  endif()
  set(target tekit_${name})
  set_property(GLOBAL APPEND PROPERTY TEKIT_SUBSYSTEMS ${name})
  if(NOT arg_SOURCES)
    return() # a subsystem whose sources are not written yet
  endif()
  add_library(${target} OBJECT ${arg_SOURCES})
  set_target_properties(${target} PROPERTIES
    POSITION_INDEPENDENT_CODE ON
    CXX_VISIBILITY_PRESET hidden
    VISIBILITY_INLINES_HIDDEN ON)
  target_compile_definitions(${target} PRIVATE TEKIT_BUILDING)
  target_compile_features(${target} PUBLIC cxx_std_20)
  target_include_directories(${target}
    PUBLIC $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>
    PRIVATE ${PROJECT_SOURCE_DIR}/src)
  target_link_libraries(${target} PRIVATE tekit_warnings)
  foreach(dependency IN LISTS arg_DEPENDS)
    if(NOT TARGET tekit_${dependency})
      message(FATAL_ERROR "subsystem ${name} depends on ${dependency}, which is not defined yet")
    endif()
  endforeach()
  # System libraries reach whoever links the objects: the shared library and the tests.
  target_link_libraries(tekit PRIVATE ${target} ${arg_LIBRARIES})
  target_link_libraries(tekit_internal PUBLIC ${target} ${arg_LIBRARIES})
endfunction()

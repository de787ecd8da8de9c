# Install rules: the library, its public headers, the tekit tool, a CMake package
# (find_package(tekit CONFIG) gives tekit::tekit) and a pkg-config file.
include(CMakePackageConfigHelpers)

set(TEKIT_INSTALL_CMAKEDIR ${CMAKE_INSTALL_LIBDIR}/cmake/tekit
    CACHE STRING "Where the CMake package files are installed, relative to the prefix")

install(TARGETS tekit EXPORT tekitTargets
        RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
        LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
        ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR}
        INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(DIRECTORY ${PROJECT_SOURCE_DIR}/include/tekit DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}
        FILES_MATCHING PATTERN "*.h" PATTERN "*.def")

if(TARGET tekit_cli)
  install(TARGETS tekit_cli RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
endif()

# ---- CMake package ----------------------------------------------------------------------
install(EXPORT tekitTargets NAMESPACE tekit:: DESTINATION ${TEKIT_INSTALL_CMAKEDIR}
        FILE tekitTargets.cmake)
configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/tekitConfig.cmake.in
                              ${PROJECT_BINARY_DIR}/tekitConfig.cmake
                              INSTALL_DESTINATION ${TEKIT_INSTALL_CMAKEDIR})
# While the major version is 0 a minor release may change the interface, so only the same
# major.minor is compatible; from 1.0 on this becomes SameMajorVersion.
write_basic_package_version_file(${PROJECT_BINARY_DIR}/tekitConfigVersion.cmake
                                 COMPATIBILITY SameMinorVersion)
install(FILES ${PROJECT_BINARY_DIR}/tekitConfig.cmake ${PROJECT_BINARY_DIR}/tekitConfigVersion.cmake
        DESTINATION ${TEKIT_INSTALL_CMAKEDIR})

# ---- pkg-config -------------------------------------------------------------------------
# The prefix is found from the .pc file's own place (${pcfiledir}), so the file stays right
# when the tree is installed with `cmake --install --prefix` somewhere else or moved.
if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}")
  message(FATAL_ERROR "tekit.pc needs a relative CMAKE_INSTALL_LIBDIR")
endif()
file(RELATIVE_PATH TEKIT_PC_TO_PREFIX /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
string(REGEX REPLACE "/$" "" TEKIT_PC_TO_PREFIX "${TEKIT_PC_TO_PREFIX}")
# System libraries that callers link as well (the OLE libraries on Windows).
get_target_property(_tekit_interface_libs tekit INTERFACE_LINK_LIBRARIES)
set(TEKIT_PC_LIBS "")
foreach(_lib IN LISTS _tekit_interface_libs)
  if(_lib MATCHES "^[A-Za-z0-9_]+$" AND NOT TARGET ${_lib})
    string(APPEND TEKIT_PC_LIBS " -l${_lib}")
  endif()
endforeach()
configure_file(${CMAKE_CURRENT_LIST_DIR}/tekit.pc.in ${PROJECT_BINARY_DIR}/tekit.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/tekit.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

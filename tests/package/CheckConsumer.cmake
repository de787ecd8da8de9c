# Installs the build tree into a fresh prefix, then builds and runs the consumer project against
# it, once with find_package(tekit CONFIG) and once with pkg-config's flags; the installed tool
# must run from the prefix too. Arguments: see tests/package/CMakeLists.txt.

# run(<command>... [OUT <var>]): stops the check with the command's output when it fails.
function(run)
  cmake_parse_arguments(PARSE_ARGV 0 RUN "" "OUT" "")
  execute_process(COMMAND ${RUN_UNPARSED_ARGUMENTS} RESULT_VARIABLE status
                  OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT status EQUAL 0)
    list(JOIN RUN_UNPARSED_ARGUMENTS " " shown)
    message(FATAL_ERROR "failed (${status}): ${shown}\n${out}\n${err}")
  endif()
  if(RUN_OUT)
    set(${RUN_OUT} "${out}" PARENT_SCOPE)
  endif()
endfunction()

function(expect_output out expected what)
  if(NOT out STREQUAL expected)
    message(SEND_ERROR "${what}: printed [${out}], expected [${expected}]")
  endif()
endfunction()

set(prefix ${WORK_DIR}/prefix)
file(REMOVE_RECURSE ${WORK_DIR})
run(${CMAKE_COMMAND} --install ${BUILD_DIR} --prefix ${prefix})

foreach(file include/tekit/tekit.h include/tekit/Export.h ${LIBDIR}/cmake/tekit/tekitConfig.cmake
             ${LIBDIR}/cmake/tekit/tekitConfigVersion.cmake ${LIBDIR}/cmake/tekit/tekitTargets.cmake
             ${LIBDIR}/pkgconfig/tekit.pc ${LIBDIR}/libkazlibwapi.so)
  if(NOT EXISTS ${prefix}/${file})
    message(SEND_ERROR "not installed: ${file}")
  endif()
endforeach()

# ---- find_package ------------------------------------------------------------------------
run(${CMAKE_COMMAND} -S ${CONSUMER_DIR} -B ${WORK_DIR}/cmake-build -G ${GENERATOR}
    -DCMAKE_PREFIX_PATH=${prefix} -DCMAKE_BUILD_TYPE=${BUILD_TYPE} -DCMAKE_CXX_COMPILER=${CXX}
    "-DCMAKE_CXX_FLAGS=${CXX_FLAGS}" "-DCMAKE_EXE_LINKER_FLAGS=${LINKER_FLAGS}"
    -DEXPECTED_VERSION=${VERSION})
run(${CMAKE_COMMAND} --build ${WORK_DIR}/cmake-build)
run(${WORK_DIR}/cmake-build/consumer OUT out)
expect_output("${out}" "consumer: ok\n" "consumer built with find_package")

# ---- pkg-config --------------------------------------------------------------------------
if(NOT PKG_CONFIG)
  message(FATAL_ERROR "pkg-config not found (Debian package: pkg-config)")
endif()
set(ENV{PKG_CONFIG_PATH} ${prefix}/${LIBDIR}/pkgconfig)
run(${PKG_CONFIG} --modversion tekit OUT version)
expect_output("${version}" "${VERSION}\n" "pkg-config --modversion tekit")
run(${PKG_CONFIG} --cflags --libs tekit OUT flags)
separate_arguments(flags UNIX_COMMAND "${flags}")
separate_arguments(cxx_flags UNIX_COMMAND "${CXX_FLAGS} ${LINKER_FLAGS}")
run(${CXX} -std=c++20 ${cxx_flags} ${CONSUMER_DIR}/main.cpp ${flags}
    -Wl,-rpath,${prefix}/${LIBDIR} -o ${WORK_DIR}/consumer-pkg-config)
run(${WORK_DIR}/consumer-pkg-config OUT out)
expect_output("${out}" "consumer: ok\n" "consumer built with pkg-config")

# ---- the installed tool --------------------------------------------------------------------
if(HAS_TOOL)
  run(${prefix}/${BINDIR}/tekit --version OUT out)
  expect_output("${out}" "tekit ${VERSION}\n" "installed tekit --version")
endif()

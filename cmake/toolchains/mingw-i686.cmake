# Cross build of the 32-bit Windows DLL, the product's own platform. These machines run no
# 32-bit program, so its tests are built but not run; the export table is checked on the host.
set(CMAKE_SYSTEM_PROCESSOR i686)
set(TEKIT_MINGW_TRIPLE i686-w64-mingw32)
include(${CMAKE_CURRENT_LIST_DIR}/mingw-common.cmake)

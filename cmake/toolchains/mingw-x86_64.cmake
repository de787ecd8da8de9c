# Cross build of the 64-bit Windows DLL with Debian's MinGW-w64 compilers; tests run under Wine.
set(CMAKE_SYSTEM_PROCESSOR x86_64)
set(TEKIT_MINGW_TRIPLE x86_64-w64-mingw32)
include(${CMAKE_CURRENT_LIST_DIR}/mingw-common.cmake)

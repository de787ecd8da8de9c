# Shared part of the MinGW-w64 cross toolchains. The including file sets TEKIT_MINGW_TRIPLE
# (x86_64-w64-mingw32 or i686-w64-mingw32) before including this one.
#
# Debian ships two thread models per target; the posix one (winpthreads) is the one whose
# libstdc++ has std::thread and std::mutex, which the library and GoogleTest use.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_VERSION 10.0)

set(CMAKE_C_COMPILER ${TEKIT_MINGW_TRIPLE}-gcc-posix)
set(CMAKE_CXX_COMPILER ${TEKIT_MINGW_TRIPLE}-g++-posix)
set(CMAKE_RC_COMPILER ${TEKIT_MINGW_TRIPLE}-windres)
set(CMAKE_AR ${TEKIT_MINGW_TRIPLE}-ar CACHE FILEPATH "Archiver")
set(CMAKE_RANLIB ${TEKIT_MINGW_TRIPLE}-ranlib CACHE FILEPATH "Ranlib")
set(CMAKE_OBJDUMP ${TEKIT_MINGW_TRIPLE}-objdump CACHE FILEPATH "Object dumper")
set(CMAKE_DLLTOOL ${TEKIT_MINGW_TRIPLE}-dlltool CACHE FILEPATH "Import library tool")

# Libraries and headers of the target (zlib from libz-mingw-w64-dev lives here).
set(CMAKE_FIND_ROOT_PATH /usr/${TEKIT_MINGW_TRIPLE})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# Programs built for the target run through Wine (see cmake/MinGWEmulator.cmake).
set(TEKIT_MINGW_CROSS ON)

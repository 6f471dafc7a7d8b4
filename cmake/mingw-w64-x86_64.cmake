# Cross-building for Windows x64 with mingw-w64 (Debian's gcc-mingw-w64-x86-64-posix):
#   cmake -S . -B build-win -DCMAKE_TOOLCHAIN_FILE=cmake/mingw-w64-x86_64.cmake
# The posix thread model gives std::thread and std::recursive_timed_mutex. Every module and
# program links the C and C++ run-times and winpthread statically, so they run on Windows (and
# under Wine) without any DLL beside them.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)

set(PEX_MINGW_TRIPLE x86_64-w64-mingw32)
find_program(CMAKE_C_COMPILER NAMES ${PEX_MINGW_TRIPLE}-gcc-posix ${PEX_MINGW_TRIPLE}-gcc REQUIRED)
find_program(CMAKE_CXX_COMPILER NAMES ${PEX_MINGW_TRIPLE}-g++-posix ${PEX_MINGW_TRIPLE}-g++ REQUIRED)
find_program(CMAKE_RC_COMPILER NAMES ${PEX_MINGW_TRIPLE}-windres windres REQUIRED)

set(CMAKE_FIND_ROOT_PATH /usr/${PEX_MINGW_TRIPLE})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

set(CMAKE_EXE_LINKER_FLAGS_INIT "-static")
set(CMAKE_SHARED_LINKER_FLAGS_INIT "-static")
set(CMAKE_MODULE_LINKER_FLAGS_INIT "-static")

# The programs run under Wine when a build step or test needs to run one.
find_program(PEX_WINE NAMES wine)
if(PEX_WINE)
  set(CMAKE_CROSSCOMPILING_EMULATOR ${PEX_WINE})
endif()

# zlib from libz-mingw-w64-dev, linked in (its import library would need zlib1.dll at run time).
set(ZLIB_USE_STATIC_LIBS ON)

# Cross build for Windows x86-64 with MinGW-w64 (the POSIX-threads variant,
# which std::thread needs). Everything is linked statically so that the
# executables run on a bare Windows without the compiler's DLLs; the tests run
# under Wine on the build machine.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)

set(PC_MINGW_PREFIX x86_64-w64-mingw32)
set(CMAKE_C_COMPILER ${PC_MINGW_PREFIX}-gcc-posix)
set(CMAKE_CXX_COMPILER ${PC_MINGW_PREFIX}-g++-posix)
set(CMAKE_RC_COMPILER ${PC_MINGW_PREFIX}-windres)

set(CMAKE_FIND_ROOT_PATH /usr/${PC_MINGW_PREFIX})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# -static takes winpthread as an archive too.
set(CMAKE_EXE_LINKER_FLAGS_INIT "-static -static-libgcc -static-libstdc++")

find_program(PC_WINE NAMES wine64 wine)
if(PC_WINE)
  set(CMAKE_CROSSCOMPILING_EMULATOR ${PC_WINE})
endif()

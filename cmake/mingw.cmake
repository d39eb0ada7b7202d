# Windows on the processor CMAKE_SYSTEM_PROCESSOR. The tests need std::thread, so the compiler is the variant
# with POSIX threads; the module is linked with the run-time of the other variant and so cannot contain any part of
# them.
set(CMAKE_SYSTEM_NAME Windows)
set(QX_TRIPLE ${CMAKE_SYSTEM_PROCESSOR}-w64-mingw32)
set(CMAKE_C_COMPILER ${QX_TRIPLE}-gcc-posix)
set(CMAKE_CXX_COMPILER ${QX_TRIPLE}-g++-posix)
set(CMAKE_RC_COMPILER ${QX_TRIPLE}-windres)
set(CMAKE_FIND_ROOT_PATH /usr/${QX_TRIPLE})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
set(CMAKE_CROSSCOMPILING_EMULATOR ${CMAKE_CURRENT_LIST_DIR}/../tools/wine-run)
# Do not link any run-time of the compiler or the language as a DLL.
set(CMAKE_EXE_LINKER_FLAGS_INIT -static)
set(CMAKE_SHARED_LINKER_FLAGS_INIT -static)

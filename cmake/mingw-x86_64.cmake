# 64-bit Windows.
set(CMAKE_SYSTEM_PROCESSOR x86_64)
set(QX_SETUP_TARGET x86_64-mingw)
include(${CMAKE_CURRENT_LIST_DIR}/mingw.cmake)

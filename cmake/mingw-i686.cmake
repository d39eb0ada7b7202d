# 32-bit Windows.
set(CMAKE_SYSTEM_PROCESSOR i686)
set(QX_SETUP_TARGET i686-mingw)
include(${CMAKE_CURRENT_LIST_DIR}/mingw.cmake)

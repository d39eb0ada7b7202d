qx_bench(windows SOURCES windows.cpp)

qx_bench(stats SOURCES stats.cpp)

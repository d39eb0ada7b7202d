qx_bench(signal SOURCES signal.cpp)

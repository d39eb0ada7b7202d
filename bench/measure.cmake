qx_bench(measure SOURCES measure.cpp)

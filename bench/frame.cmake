qx_bench(frame SOURCES frame.cpp)
set_target_properties(bench_frame PROPERTIES ENABLE_EXPORTS ON)

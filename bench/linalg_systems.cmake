qx_bench(linalg_systems SOURCES linalg_systems.cpp)
# The cost of the frame is measured by calls through the module and the stand-in host.
target_link_libraries(bench_linalg_systems PRIVATE qxanalysis qxrt)
target_include_directories(bench_linalg_systems PRIVATE ${QX_LAPACK_HEADERS})
target_link_libraries(bench_linalg_systems PRIVATE ${CMAKE_DL_LIBS})

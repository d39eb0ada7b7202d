# Filtering sample by sample is timed through its export, with this program as the host.
qx_bench(filters SOURCES filters.cpp PEERS liquid)
target_link_libraries(bench_filters PRIVATE qxanalysis)
set_target_properties(bench_filters PROPERTIES ENABLE_EXPORTS ON)

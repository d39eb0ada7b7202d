qx_bench(fit_lines SOURCES fit_lines.cpp)

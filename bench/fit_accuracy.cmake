qx_bench(fit_accuracy SOURCES fit_accuracy.cpp)

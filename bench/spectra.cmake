qx_bench(spectra SOURCES spectra.cpp)

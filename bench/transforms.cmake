qx_bench(transforms SOURCES transforms.cpp PEERS fftw3)

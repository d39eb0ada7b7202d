qx_bench(fft2d SOURCES fft2d.cpp PEERS fftw3)

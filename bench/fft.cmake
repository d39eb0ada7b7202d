qx_bench(fft SOURCES fft.cpp PEERS fftw3)

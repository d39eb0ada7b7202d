qx_bench(fft SOURCES fft.cpp PEERS fftw3)
qx_bench(fft_accuracy SOURCES fft_accuracy.cpp PEERS fftw3)

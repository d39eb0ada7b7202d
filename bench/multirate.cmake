qx_bench(multirate SOURCES multirate.cpp PEERS liquid samplerate)

qx_bench(special SOURCES special.cpp special_bessel.cpp PEERS gsl)

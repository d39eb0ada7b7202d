qx_bench(poly SOURCES poly.cpp PEERS gsl)

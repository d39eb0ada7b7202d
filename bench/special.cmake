qx_bench(special
    SOURCES special.cpp special_bessel.cpp special_gamma.cpp special_hypergeometric.cpp special_integrals.cpp
    PEERS gsl)

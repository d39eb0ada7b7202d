qx_bench(special
    SOURCES special.cpp special_bessel.cpp special_gamma.cpp special_hypergeometric.cpp special_integrals.cpp
    PEERS gsl boost)
# Boost in double precision, like the others; by default it computes in long double.
target_compile_definitions(bench_special PRIVATE BOOST_MATH_PROMOTE_DOUBLE_POLICY=false)

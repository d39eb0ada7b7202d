qx_bench(fit_nonlinear SOURCES fit_nonlinear.cpp PEERS gsl)

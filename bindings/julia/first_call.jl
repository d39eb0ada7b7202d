# Mean, modes and a failure: QX_LIBRARY_DIR=... julia --project=. first_call.jl
import QXAnalysis
const QX = QXAnalysis

x, modes = QX.array([2.0, 4, 4, 4, 5, 5, 7, 9]), QX.array(Float64[])
mean, moment, err, order = Ref(0.0), Ref(0.0), Ref(Int32(0)), Ref(Int32(0))
QX.Mean_head(x, mean, err)
println("mean ", mean[])
code = QX.ModeH(x, 0, modes)
println("modes ", QX.elements(modes), " (code ", code, ")")
QX.Moment_head(x, order, moment, err)
println("order 0: ", QX.error_name(err[]))
QX.release(modes)
QX.release(x)

"""
The exports of the QX analysis library with their C signatures, and the stand-in host that creates their arrays.

An array is a handle, a pointer to a pointer to a block: the sizes, then the elements. Numbers and records that an
export writes are passed as a `Ref`. 0 is success, a negative code is a failure, a positive one a warning.
"""
module QXAnalysis

using Libdl

const folder = get(ENV, "QX_LIBRARY_DIR", "")
const libqxrt = joinpath(folder, "libqxrt")
const libqxanalysis = joinpath(folder, "libqxanalysis")
const DBL, CDB, INT = Int32(10), Int32(13), Int32(3)

# When the module is loaded, it looks for its host among the libraries of the process.
__init__() = dlopen(libqxrt)

"An array of numbers; `release` frees it."
function array(x::Vector{Float64})
    handle = ccall((:QXHostCopy1D, libqxrt), Ptr{Cvoid}, (Int32, Int32, Ptr{Float64}), DBL, length(x), x)
    handle == C_NULL && throw(OutOfMemoryError())
    handle
end
release(handle) = ccall((:QXHostFree, libqxrt), Cvoid, (Ptr{Cvoid},), handle)

"The elements of an array of numbers of one dimension."
function elements(handle)
    block = unsafe_load(Ptr{Ptr{Int32}}(handle))
    count = unsafe_load(block)
    found = Vector{Float64}(undef, count)
    GC.@preserve found unsafe_copyto!(Ptr{UInt8}(pointer(found)), Ptr{UInt8}(block) + 4, 8 * count)
    found
end

error_name(code) = unsafe_string(ccall((:QXHostErrorName, libqxrt), Cstring, (Int32,), code))
error_text(code) = unsafe_string(ccall((:QXHostErrorText, libqxrt), Cstring, (Int32,), code))

# The bytes of a record that C lays out without gaps, from the values of its fields and back.
packed(values...) = Tuple(reduce(vcat, [collect(reinterpret(UInt8, [value])) for value in values]))
part(bytes, T, offset) = reinterpret(T, collect(bytes[offset+1:offset+sizeof(T)]))[1]

include("exports.jl")

end

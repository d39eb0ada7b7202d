# Flags that are part of the contract on every target: the order of arithmetic written in the
# code is the order executed. No fast-math in any form.
add_library(qxflags INTERFACE)
target_compile_options(qxflags INTERFACE -ffp-contract=off -fno-math-errno -fvisibility=hidden
    $<$<COMPILE_LANGUAGE:CXX>:-fvisibility-inlines-hidden> -Wall -Wextra -Wshadow)
# Warnings about intended code: element types lose their byte alignment as template arguments, and
# vectors wider than the registers are passed only between functions of the same build.
target_compile_options(qxflags INTERFACE $<$<COMPILE_LANGUAGE:CXX>:-Wno-ignored-attributes> -Wno-psabi)

# Functions of constants must be computed by the module's own mathematics library, not by the compiler.
foreach(function IN ITEMS sin cos tan asin acos atan atan2 sinh cosh tanh exp exp2 expm1 log log2
        log10 log1p pow cbrt hypot fmod)
    target_compile_options(qxflags INTERFACE -fno-builtin-${function})
endforeach()

# Processors for which routines over lanes are compiled a second time, for AVX2. ARM has one width.
if(CMAKE_SYSTEM_PROCESSOR MATCHES "^(x86_64|AMD64|i[3-6]86)$")
    set(QX_AVX2 ON)
else()
    set(QX_AVX2 OFF)
endif()
# Threads meet in the same places at every width.
if(QX_SANITIZE MATCHES thread)
    set(QX_AVX2 OFF)
    target_compile_definitions(qxflags INTERFACE QX_ONE_WIDTH)
endif()

if(CMAKE_SIZEOF_VOID_P EQUAL 4)
    # With the property QX_LOOSE_STACK, a target keeps the stack aligned to 4 bytes only, as compilers of the
    # 32-bit platforms may do.
    set(loose $<BOOL:$<TARGET_PROPERTY:QX_LOOSE_STACK>>)
    target_compile_options(qxflags INTERFACE -msse2 -mfpmath=sse $<$<NOT:${loose}>:-mstackrealign>
        $<${loose}:-mno-stackrealign> $<${loose}:-mpreferred-stack-boundary=2> $<${loose}:-mincoming-stack-boundary=2>)
endif()
if(QX_SANITIZE)
    target_compile_options(qxflags INTERFACE -fsanitize=${QX_SANITIZE} -fno-omit-frame-pointer
        -fno-sanitize-recover=all)
    target_link_options(qxflags INTERFACE -fsanitize=${QX_SANITIZE})
    # A straight-line transform has thousands of accesses: with calls for the checks, it compiles in a third
    # of the time (gcc's own limit is 7000).
    if(QX_SANITIZE MATCHES address AND CMAKE_CXX_COMPILER_ID STREQUAL GNU)
        target_compile_options(qxflags INTERFACE
            $<$<COMPILE_LANGUAGE:CXX>:--param=asan-instrumentation-with-call-threshold=500>)
    endif()
endif()
# The builds that check the preconditions of inner routines (frame/expects.h).
if(QX_SANITIZE)
    target_compile_definitions(qxflags INTERFACE QX_CHECKED)
else()
    target_compile_definitions(qxflags INTERFACE $<$<CONFIG:Debug>:QX_CHECKED>)
endif()
# In a debug build, converting a number that is out of the range of the integer type ends the program.
if(NOT QX_SANITIZE)
    target_compile_options(qxflags INTERFACE
        $<$<CONFIG:Debug>:-fsanitize=float-cast-overflow -fsanitize-undefined-trap-on-error>)
endif()

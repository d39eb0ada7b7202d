# qx_family(CORE basic.cpp ...                inner routines, into qxcore
#           LANES convolve_lanes.cpp ...      inner routines written over lanes: once per width
#                                             (frame/widths.h)
#           WIDE_LANES product_lanes.cpp ...  such routines that gain by eight lanes as well
#           EIGHT_LANES wide_product.cpp ...  routines of eight lanes alone, which the others choose
#           EXPORTS exports/basic.cpp ...     frames, into the module
#           TESTS tests/basic_test.cpp ...    one test program <family>_test
#           RECIPES recipes/basic.cpp ...     how the conformance tests call the exports
#           UNLISTED file.cpp ...)            sources for which the folder cares itself
# A source with its full path is one that the build writes.
#
# The family is the folder that says so. A source in the folder that stands in no list fails the
# configuration, as a listed one that does not exist does; so nothing is skipped without a word.
function(qx_family)
    cmake_parse_arguments(F "" "" "CORE;LANES;WIDE_LANES;EIGHT_LANES;EXPORTS;TESTS;RECIPES;UNLISTED" ${ARGN})
    if(F_UNPARSED_ARGUMENTS)
        message(FATAL_ERROR "qx_family: ${F_UNPARSED_ARGUMENTS} belongs to no list")
    endif()
    cmake_path(GET CMAKE_CURRENT_SOURCE_DIR FILENAME family)
    file(GLOB_RECURSE found CONFIGURE_DEPENDS RELATIVE ${CMAKE_CURRENT_SOURCE_DIR} *.cpp)
    foreach(source IN LISTS found)
        if(NOT source IN_LIST F_CORE AND NOT source IN_LIST F_LANES
            AND NOT source IN_LIST F_WIDE_LANES AND NOT source IN_LIST F_EIGHT_LANES
            AND NOT source IN_LIST F_EXPORTS
            AND NOT source IN_LIST F_TESTS AND NOT source IN_LIST F_RECIPES
            AND NOT source IN_LIST F_UNLISTED)
            message(FATAL_ERROR "${CMAKE_CURRENT_SOURCE_DIR}/${source} stands in no list of its family")
        endif()
    endforeach()

    list(TRANSFORM F_CORE PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
    list(TRANSFORM F_WIDE_LANES PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/ REGEX "^[^/]+(/[^/]+)*$")
    list(TRANSFORM F_LANES PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/ REGEX "^[^/]+(/[^/]+)*$")
    list(APPEND F_LANES ${F_WIDE_LANES})
    list(TRANSFORM F_EIGHT_LANES PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/ REGEX "^[^/]+(/[^/]+)*$")
    list(APPEND F_EIGHT_LANES ${F_WIDE_LANES})
    list(TRANSFORM F_EXPORTS PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
    list(TRANSFORM F_RECIPES PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
    target_sources(qxcore PRIVATE ${F_CORE} ${F_LANES})
    if(F_LANES AND QX_AVX2)
        qx_compile_for_avx2(${family} ${F_LANES})
    endif()
    if(F_EIGHT_LANES AND QX_EIGHT_LANES)
        qx_compile_for_avx512(${family} ${F_EIGHT_LANES})
    endif()
    target_sources(qxanalysis PRIVATE ${F_EXPORTS})
    if(QX_TESTS)
        target_sources(qxrecipes PRIVATE ${F_RECIPES})
        if(F_TESTS)
            qx_test(${family}_test ${F_TESTS})
            if(F_LANES)
                qx_run_at_width(${family}_test 2)
            endif()
            if(F_EIGHT_LANES AND QX_EIGHT_LANES)
                qx_run_at_width(${family}_test 4)
            endif()
        endif()
    endif()
endfunction()

# Where there are routines of eight lanes (frame/widths.h says why not elsewhere).
set(QX_EIGHT_LANES FALSE)
if(CMAKE_SYSTEM_PROCESSOR MATCHES "^(x86_64|amd64|AMD64)$" AND CMAKE_SIZEOF_VOID_P EQUAL 8 AND NOT WIN32)
    set(QX_EIGHT_LANES TRUE)
endif()

# The sources once more, into the same core, for processors with AVX2. No fused multiplication, for
# the compiler's vectoriser makes use of it whatever -ffp-contract says (g++ 12).
function(qx_compile_for_avx2 family)
    qx_compile_for_width(${family} avx2 "-mavx2;-mno-fma;-mno-avx512f" ${ARGN})
endfunction()
# And for those with AVX-512, which has fused multiplication in itself; so the vectoriser is off, and plain
# loops that matter are written over lanes. tests/widths_test.py looks at the instructions.
function(qx_compile_for_avx512 family)
    qx_compile_for_width(${family} avx512
        "-mavx512f;-mavx512dq;-mavx512bw;-mavx512vl;-fno-tree-vectorize;-fno-tree-slp-vectorize" ${ARGN})
endfunction()
# Inline functions and instances of templates stay local (g++: -fno-weak, which warns of constants
# that become several; the baseline build tells the warnings that count), so that the linker cannot
# choose one of these for the baseline; tests/widths_test.py looks at the objects.
#
# On 64-bit Windows the stack is aligned to 16 bytes, and g++ may take it for aligned to 32. Debian's does not;
# the assembler makes of the aligned moves of any other ones that need no alignment.
function(qx_compile_for_width family width options)
    set(objects ${family}_${width})
    add_library(${objects} OBJECT ${ARGN})
    target_compile_definitions(${objects} PRIVATE QX_WIDTH=${width})
    target_compile_options(${objects} PRIVATE ${options}
        $<$<CXX_COMPILER_ID:GNU>:-fno-weak> $<$<CXX_COMPILER_ID:GNU>:-w>)
    if(WIN32 AND CMAKE_SIZEOF_VOID_P EQUAL 8)
        target_compile_options(${objects} PRIVATE -Wa,-muse-unaligned-vector-move)
    endif()
    target_include_directories(${objects} PRIVATE ${PROJECT_SOURCE_DIR}/src ${PROJECT_SOURCE_DIR}/include)
    target_link_libraries(${objects} PRIVATE qxflags)
    target_sources(qxcore PRIVATE $<TARGET_OBJECTS:${objects}>)
    set_property(GLOBAL APPEND PROPERTY QX_OBJECTS_OF_${width} ${objects})
endfunction()

# A test program: links the core (inner routines), the module (exports) and the test support, and
# finds a file of its tests/data by qx::test::TestData (tests/support/test_data.h).
function(qx_test name)
    # A file of its own and no definition: the tests' objects then know no path, and a compiler
    # cache serves them for every work tree.
    set(place ${CMAKE_CURRENT_BINARY_DIR}/${name}_data.cpp)
    file(CONFIGURE OUTPUT ${place} CONTENT
"#include \"tests/support/test_data.h\"
const char *const qx::test::testDataFolder = \"${CMAKE_CURRENT_SOURCE_DIR}/tests/data/\";
")
    add_executable(${name} ${ARGN} ${place})
    set_target_properties(${name} PROPERTIES ENABLE_EXPORTS ON)
    target_link_libraries(${name} PRIVATE qxanalysis qxcore qxtestsupport GTest::gtest_main)
    get_property(precompiled GLOBAL PROPERTY QX_PRECOMPILED)
    if(precompiled)
        target_precompile_headers(${name} REUSE_FROM ${precompiled})
    endif()
    qx_run_as_test(${name})
endfunction()

function(qx_run_as_test name)
    add_test(NAME ${name} COMMAND ${name} --gtest_brief=1)
    # The runner of another target says so where it cannot run anything.
    set_tests_properties(${name} PROPERTIES SKIP_RETURN_CODE 77)
endfunction()

# The program once more as on a processor of at most that many lanes: 2, or 4 where the processor has more.
# The sanitizers run at the smallest and the largest width.
set(QX_WIDEST 4)
if(QX_EIGHT_LANES AND EXISTS /proc/cpuinfo)
    file(STRINGS /proc/cpuinfo wide REGEX "avx512f.*avx512dq.*avx512bw.*avx512vl" LIMIT_COUNT 1)
    if(wide)
        set(QX_WIDEST 8)
    endif()
endif()
function(qx_run_at_width name lanes)
    if(NOT QX_AVX2 OR NOT lanes LESS QX_WIDEST OR (QX_SANITIZE AND lanes GREATER 2))
        return()
    endif()
    add_test(NAME ${name}_width${lanes} COMMAND ${name} --gtest_brief=1)
    set_tests_properties(${name}_width${lanes} PROPERTIES SKIP_RETURN_CODE 77 ENVIRONMENT QX_WIDTH=${lanes})
endfunction()

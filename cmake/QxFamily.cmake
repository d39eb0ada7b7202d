# qx_family(CORE basic.cpp ...                inner routines, into qxcore
#           LANES convolve_lanes.cpp ...      inner routines written over lanes: once per width
#                                             (frame/widths.h)
#           EXPORTS exports/basic.cpp ...     frames, into the module
#           TESTS tests/basic_test.cpp ...    one test program <family>_test
#           RECIPES recipes/basic.cpp ...     how the conformance tests call the exports
#           UNLISTED file.cpp ...)            sources for which the folder cares itself
# A source with its full path is one that the build writes.
#
# The family is the folder that says so. A source in the folder that stands in no list fails the
# configuration, as a listed one that does not exist does; so nothing is skipped without a word.
function(qx_family)
    cmake_parse_arguments(F "" "" "CORE;LANES;EXPORTS;TESTS;RECIPES;UNLISTED" ${ARGN})
    if(F_UNPARSED_ARGUMENTS)
        message(FATAL_ERROR "qx_family: ${F_UNPARSED_ARGUMENTS} belongs to no list")
    endif()
    cmake_path(GET CMAKE_CURRENT_SOURCE_DIR FILENAME family)
    file(GLOB_RECURSE found CONFIGURE_DEPENDS RELATIVE ${CMAKE_CURRENT_SOURCE_DIR} *.cpp)
    foreach(source IN LISTS found)
        if(NOT source IN_LIST F_CORE AND NOT source IN_LIST F_LANES AND NOT source IN_LIST F_EXPORTS
            AND NOT source IN_LIST F_TESTS AND NOT source IN_LIST F_RECIPES
            AND NOT source IN_LIST F_UNLISTED)
            message(FATAL_ERROR "${CMAKE_CURRENT_SOURCE_DIR}/${source} stands in no list of its family")
        endif()
    endforeach()

    list(TRANSFORM F_CORE PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
    list(TRANSFORM F_LANES PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/ REGEX "^[^/]+(/[^/]+)*$")
    list(TRANSFORM F_EXPORTS PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
    list(TRANSFORM F_RECIPES PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
    target_sources(qxcore PRIVATE ${F_CORE} ${F_LANES})
    if(F_LANES AND QX_AVX2)
        qx_compile_for_avx2(${family} ${F_LANES})
    endif()
    target_sources(qxanalysis PRIVATE ${F_EXPORTS})
    if(QX_TESTS)
        target_sources(qxrecipes PRIVATE ${F_RECIPES})
        if(F_TESTS)
            qx_test(${family}_test ${F_TESTS})
            if(F_LANES)
                qx_run_at_baseline(${family}_test)
            endif()
        endif()
    endif()
endfunction()

# The sources once more, into the same core, for processors with AVX2. No fused multiplication, for
# the compiler's vectoriser makes use of it whatever -ffp-contract says (g++ 12), and AVX-512 has its
# own. Inline functions and instances of templates stay local (g++: -fno-weak, which warns of constants
# that become several; the baseline build tells the warnings that count), so that the linker cannot
# choose one of these for the baseline; tests/widths_test.py looks at the objects.
#
# On 64-bit Windows g++ aligns the stack to 16 bytes and takes it for aligned to 32: the assembler makes
# of every aligned move one that needs no alignment.
function(qx_compile_for_avx2 family)
    add_library(${family}_avx2 OBJECT ${ARGN})
    target_compile_definitions(${family}_avx2 PRIVATE QX_WIDTH=avx2)
    target_compile_options(${family}_avx2 PRIVATE -mavx2 -mno-fma -mno-avx512f
        $<$<CXX_COMPILER_ID:GNU>:-fno-weak> $<$<CXX_COMPILER_ID:GNU>:-w>)
    if(WIN32 AND CMAKE_SIZEOF_VOID_P EQUAL 8)
        target_compile_options(${family}_avx2 PRIVATE -Wa,-muse-unaligned-vector-move)
    endif()
    target_include_directories(${family}_avx2 PRIVATE ${PROJECT_SOURCE_DIR}/src ${PROJECT_SOURCE_DIR}/include)
    target_link_libraries(${family}_avx2 PRIVATE qxflags)
    target_sources(qxcore PRIVATE $<TARGET_OBJECTS:${family}_avx2>)
    set_property(GLOBAL APPEND PROPERTY QX_AVX2_TARGETS ${family}_avx2)
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

# The program once more as on a processor without AVX2.
function(qx_run_at_baseline name)
    if(NOT QX_AVX2)
        return()
    endif()
    add_test(NAME ${name}_baseline COMMAND ${name} --gtest_brief=1)
    set_tests_properties(${name}_baseline PROPERTIES SKIP_RETURN_CODE 77 ENVIRONMENT QX_WIDTH=2)
endfunction()

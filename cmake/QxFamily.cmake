# qx_family(NAME stats
#           CORE basic.cpp ...              inner routines, into qxcore
#           EXPORTS exports/basic.cpp ...   frames, into the module
#           TESTS tests/basic_test.cpp ...) one test program <name>_test
function(qx_family)
    cmake_parse_arguments(F "" "NAME" "CORE;EXPORTS;TESTS" ${ARGN})
    list(TRANSFORM F_CORE PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
    list(TRANSFORM F_EXPORTS PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
    target_sources(qxcore PRIVATE ${F_CORE})
    target_sources(qxanalysis PRIVATE ${F_EXPORTS})
    if(QX_TESTS AND F_TESTS)
        qx_test(${F_NAME}_test ${F_TESTS})
    endif()
endfunction()

# A test program: links the core (inner routines), the module (exports) and the test support.
function(qx_test name)
    add_executable(${name} ${ARGN})
    set_target_properties(${name} PROPERTIES ENABLE_EXPORTS ON)
    target_link_libraries(${name} PRIVATE qxanalysis qxcore qxtestsupport GTest::gtest_main)
    qx_run_as_test(${name})
endfunction()

function(qx_run_as_test name)
    add_test(NAME ${name} COMMAND ${name} --gtest_brief=1)
    # The runner of another target says so where it cannot run anything.
    set_tests_properties(${name} PROPERTIES SKIP_RETURN_CODE 77)
endfunction()

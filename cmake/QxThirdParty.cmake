# The libraries that the module carries: the mathematics library, and LAPACK with its BLAS. ./setup builds them
# from pinned sources with one compiler and one set of flags for every configuration of a target, so
# that every export gives the same bits in all of them; this file only looks for them.
if(NOT DEFINED QX_SETUP_TARGET) # the files for other targets set it
    set(QX_SETUP_TARGET linux)
endif()
set(setup ./setup)
foreach(pair IN ITEMS "i686-mingw win32" "x86_64-mingw win64" "arm64 arm64")
    string(REGEX MATCH "(.*) (.*)" pair ${pair})
    if(CMAKE_MATCH_1 STREQUAL QX_SETUP_TARGET)
        set(setup "./setup ${CMAKE_MATCH_2}")
    endif()
endforeach()
# The libraries depend on all of these.
file(GLOB recipes CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/tools/setup/*
    ${PROJECT_SOURCE_DIR}/tools/setup/patches/*/*.patch ${PROJECT_SOURCE_DIR}/src/mathlib/*.c ${PROJECT_SOURCE_DIR}/src/mathlib/pair.h)
list(FILTER recipes EXCLUDE REGEX "/patches$")
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${recipes})

set(QX_SETUP_TARGET_libm ${QX_SETUP_TARGET})
set(QX_SETUP_TARGET_lapack ${QX_SETUP_TARGET})
if(QX_SANITIZE MATCHES address)
    set(QX_SETUP_TARGET_lapack linux-asan) # so that compiled Fortran is checked, too
    set(setup "./setup all")
endif()
foreach(library IN ITEMS libm lapack)
    execute_process(COMMAND ${PROJECT_SOURCE_DIR}/tools/setup/${library} ${QX_SETUP_TARGET_${library}} find
        OUTPUT_VARIABLE archive OUTPUT_STRIP_TRAILING_WHITESPACE RESULT_VARIABLE missing)
    if(missing)
        message(FATAL_ERROR "What the module carries is not built yet (${library} for "
            "${QX_SETUP_TARGET_${library}}): run ${setup} in ${PROJECT_SOURCE_DIR}")
    endif()
    add_library(qx${library} STATIC IMPORTED GLOBAL)
    cmake_path(GET archive PARENT_PATH folder)
    set_target_properties(qx${library} PROPERTIES IMPORTED_LOCATION ${archive})
    set(QX_FOLDER_${library} ${folder})
endforeach()
# A header of LAPACK. Only one source includes it, so no other compilation depends on its path.
set(QX_LAPACK_HEADERS ${QX_FOLDER_lapack}/include)
# The core provides the run-time functions that compiled Fortran calls, and our own routines of BLAS.
target_link_libraries(qxlapack INTERFACE qxcore qxlibm)

# Their licences, which are installed with the module (NOTICE.md), under the name of the library.
set(QX_LICENCES ${PROJECT_BINARY_DIR}/licences)
file(REMOVE_RECURSE ${QX_LICENCES})
foreach(pair IN ITEMS libm:musl lapack:lapack)
    string(REGEX MATCH "(.*):(.*)" pair ${pair})
    file(GLOB texts ${QX_FOLDER_${CMAKE_MATCH_1}}/licences/*)
    foreach(text IN LISTS texts)
        cmake_path(GET text FILENAME name)
        configure_file(${text} ${QX_LICENCES}/${CMAKE_MATCH_2}-${name} COPYONLY)
    endforeach()
endforeach()
configure_file(${PROJECT_SOURCE_DIR}/NOTICE.md ${QX_LICENCES}/NOTICE.md COPYONLY)
if(WIN32)
    configure_file(/usr/share/doc/gcc-mingw-w64-base/copyright ${QX_LICENCES}/windows-gcc-copyright COPYONLY)
    string(REPLACE _ - processor ${CMAKE_SYSTEM_PROCESSOR})
    configure_file(/usr/share/doc/mingw-w64-${processor}-dev/copyright
        ${QX_LICENCES}/windows-mingw-w64-copyright COPYONLY)
endif()

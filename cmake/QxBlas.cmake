# BLAS and LAPACK that the module carries: built from source once, static, free of threads and
# safe to call from several. Only src/linalg/lapack.cpp includes their headers.
foreach(library IN ITEMS lapack openblas)
    execute_process(COMMAND ${PROJECT_SOURCE_DIR}/tools/setup/${library} ${QX_LIBM_KIND}
        OUTPUT_VARIABLE archive OUTPUT_STRIP_TRAILING_WHITESPACE RESULT_VARIABLE failed)
    if(failed)
        message(FATAL_ERROR "${library} is missing: tools/setup/${library} ${QX_LIBM_KIND} failed")
    endif()
    add_library(qx${library} STATIC IMPORTED GLOBAL)
    set_target_properties(qx${library} PROPERTIES IMPORTED_LOCATION ${archive})
endforeach()
get_target_property(archive qxlapack IMPORTED_LOCATION)
cmake_path(GET archive PARENT_PATH folder)
set_target_properties(qxlapack PROPERTIES INTERFACE_INCLUDE_DIRECTORIES ${folder}/include)
# The core has what compiled Fortran asks for.
target_link_libraries(qxlapack INTERFACE qxopenblas qxcore)
target_link_libraries(qxopenblas INTERFACE qxlibm)

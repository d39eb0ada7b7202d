# The mathematics library that the module carries: one source, one compiler and one set of flags
# for every target and configuration, so that every export gives the same bits everywhere. It
# stands before the system's libm in each link, and nothing of it is visible outside.
if(WIN32)
    set(QX_LIBM_KIND i686-mingw)
else()
    set(QX_LIBM_KIND linux)
endif()
execute_process(COMMAND ${PROJECT_SOURCE_DIR}/tools/setup/libm ${QX_LIBM_KIND}
    OUTPUT_VARIABLE QX_LIBM_ARCHIVE OUTPUT_STRIP_TRAILING_WHITESPACE RESULT_VARIABLE failed)
if(failed)
    message(FATAL_ERROR "The mathematics library is missing: tools/setup/libm ${QX_LIBM_KIND} failed")
endif()
add_library(qxlibm STATIC IMPORTED GLOBAL)
set_target_properties(qxlibm PROPERTIES IMPORTED_LOCATION ${QX_LIBM_ARCHIVE})

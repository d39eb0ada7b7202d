# The libraries for other machines: linked again from the same objects, with the language's run-time linked
# in and with the oldest possible versions of C library functions. They are in portable/, with everything that a
# wheel needs.
set(QX_PORTABLE ${PROJECT_BINARY_DIR}/portable)

add_library(qxportable OBJECT EXCLUDE_FROM_ALL ${PROJECT_SOURCE_DIR}/src/frame/portable_linux.cpp)
target_link_libraries(qxportable PRIVATE qxflags)
# Parts of the C library since 2.34; for an older one they must be named.
foreach(library IN ITEMS libdl.so.2 libpthread.so.0)
    execute_process(COMMAND ${CMAKE_C_COMPILER} -print-file-name=${library}
        OUTPUT_VARIABLE found OUTPUT_STRIP_TRAILING_WHITESPACE)
    list(APPEND QX_ELDER_LIBRARIES ${found})
endforeach()

# qx_portable(NAME TARGET...): links TARGET a second time, under the same name.
function(qx_portable name)
    target_sources(${name} PRIVATE $<TARGET_OBJECTS:qxportable>)
    target_link_options(${name} PRIVATE -static-libstdc++ -static-libgcc
        -Wl,--gc-sections -Wl,--wrap=dlopen,--wrap=dlsym,--wrap=dladdr1,--wrap=dlinfo
        -Wl,--wrap=pthread_once,--wrap=__pthread_key_create)
    target_link_libraries(${name} PRIVATE -Wl,--no-as-needed ${QX_ELDER_LIBRARIES} -Wl,--as-needed)
    set_target_properties(${name} PROPERTIES LIBRARY_OUTPUT_DIRECTORY ${QX_PORTABLE}
        RUNTIME_OUTPUT_DIRECTORY ${QX_PORTABLE} INSTALL_RPATH \$ORIGIN BUILD_WITH_INSTALL_RPATH ON)
endfunction()

add_library(qxanalysis_portable SHARED EXCLUDE_FROM_ALL $<TARGET_OBJECTS:qxanalysis>)
target_link_libraries(qxanalysis_portable PRIVATE qxcore)
set_target_properties(qxanalysis_portable PROPERTIES OUTPUT_NAME qxanalysis)
qx_show_exports_only(qxanalysis_portable)
qx_portable(qxanalysis_portable)

add_library(qxrt_portable SHARED EXCLUDE_FROM_ALL $<TARGET_OBJECTS:qxrt>)
target_link_libraries(qxrt_portable PRIVATE qxflags)
set_target_properties(qxrt_portable PROPERTIES OUTPUT_NAME qxrt)
target_link_options(qxrt_portable PRIVATE -Wl,--exclude-libs,ALL)
qx_portable(qxrt_portable)
target_compile_options(qxportable PRIVATE -fvisibility=hidden)

# The program behind `python3 -m qx verify`. The start-up code of a program needs the version of the C library with
# which it is linked: 2.34.
add_executable(print_hashes_portable EXCLUDE_FROM_ALL ${PROJECT_SOURCE_DIR}/tests/conformance/print_hashes.cpp)
set_target_properties(print_hashes_portable PROPERTIES OUTPUT_NAME print_hashes ENABLE_EXPORTS ON)
target_link_libraries(print_hashes_portable PRIVATE qxanalysis_portable qxtestsupport qxrecipes)
target_link_options(print_hashes_portable PRIVATE -s -Wl,--exclude-libs,ALL)
qx_portable(print_hashes_portable)

add_custom_target(portable DEPENDS qxanalysis_portable qxrt_portable print_hashes_portable
    COMMAND ${CMAKE_COMMAND} -E copy_if_different ${QX_CATALOGUE} ${QX_PORTABLE}
    COMMAND ${CMAKE_COMMAND} -E copy_if_different ${PROJECT_SOURCE_DIR}/tests/conformance/hashes.txt ${QX_PORTABLE}
    COMMAND ${CMAKE_COMMAND} -E copy_directory ${QX_LICENCES} ${QX_PORTABLE}/licences VERBATIM)

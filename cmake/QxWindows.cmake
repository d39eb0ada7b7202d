# The names under which the host and the module look for the files.
set(CMAKE_SHARED_LIBRARY_PREFIX "")

# Links a module as the host expects it: imports only from KERNEL32, USER32 and the C run-time,
# undecorated exports. The language run-time is that of the compiler without POSIX threads.
function(qx_link_as_host_module target)
    execute_process(COMMAND ${QX_TRIPLE}-g++-win32 -print-libgcc-file-name
        OUTPUT_VARIABLE archive OUTPUT_STRIP_TRAILING_WHITESPACE RESULT_VARIABLE failed)
    if(failed)
        string(REPLACE _ - processor ${CMAKE_SYSTEM_PROCESSOR})
        message(FATAL_ERROR "Missing compiler: apt-get install g++-mingw-w64-${processor}-win32")
    endif()
    get_filename_component(folder ${archive} DIRECTORY)
    target_link_options(${target} PRIVATE -L${folder} -Wl,--exclude-libs,ALL)
endfunction()

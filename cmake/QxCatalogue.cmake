# The public headers are the catalogue of the exports. From them come catalogue.json, which the
# Python package, the reference pages and the conformance tests read, and the list of names that
# the module shows. An export that cannot be read fails the build.
find_program(QX_PYTHON NAMES python3 PATHS /usr/bin NO_DEFAULT_PATH)
if(NOT QX_PYTHON)
    find_program(QX_PYTHON NAMES python3 REQUIRED)
endif()
file(GLOB QX_HEADERS CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/include/qx/*.h)
# The header that includes all others is written, too, and found beside them.
set(QX_UMBRELLA ${CMAKE_BINARY_DIR}/include/qx/qx.h)
set(QX_CATALOGUE ${CMAKE_BINARY_DIR}/catalogue.json)
add_custom_command(OUTPUT ${QX_CATALOGUE} ${CMAKE_BINARY_DIR}/exports.map
        ${CMAKE_BINARY_DIR}/exports.def ${CMAKE_BINARY_DIR}/exports.codes ${QX_UMBRELLA}
    COMMAND ${QX_PYTHON} ${CMAKE_SOURCE_DIR}/tools/catalogue.py ${CMAKE_SOURCE_DIR}/include
        --json ${QX_CATALOGUE} --map ${CMAKE_BINARY_DIR}/exports.map --def ${CMAKE_BINARY_DIR}/exports.def
        --codes ${CMAKE_BINARY_DIR}/exports.codes --umbrella ${QX_UMBRELLA} --version ${PROJECT_VERSION}
    DEPENDS ${QX_HEADERS} ${CMAKE_SOURCE_DIR}/tools/catalogue.py
    COMMENT "Reading the exports from the public headers" VERBATIM)
add_custom_target(catalogue ALL
    DEPENDS ${QX_CATALOGUE} ${CMAKE_BINARY_DIR}/exports.map ${CMAKE_BINARY_DIR}/exports.def
        ${CMAKE_BINARY_DIR}/exports.codes ${QX_UMBRELLA})

# Windows shows what is marked for export and nothing else; elsewhere the linker is told.
function(qx_show_exports_only target)
    add_dependencies(${target} catalogue)
    if(NOT WIN32)
        target_link_options(${target} PRIVATE -Wl,--exclude-libs,ALL
            -Wl,--version-script=${CMAKE_BINARY_DIR}/exports.map)
        set_target_properties(${target} PROPERTIES LINK_DEPENDS ${CMAKE_BINARY_DIR}/exports.map)
    endif()
endfunction()

# The public headers are the catalogue of the exports. From them come catalogue.json, which the
# Python package, the reference pages and the conformance tests read, and the list of names that
# the module exports. An export that cannot be read fails the build.
find_program(QX_PYTHON NAMES python3 PATHS /usr/bin NO_DEFAULT_PATH)
if(NOT QX_PYTHON)
    find_program(QX_PYTHON NAMES python3 REQUIRED)
endif()
file(GLOB QX_HEADERS CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/include/qx/*.h)
# The build also writes the header that includes all others, and makes it available with them.
set(QX_UMBRELLA ${PROJECT_BINARY_DIR}/include/qx/qx.h)
set(QX_CATALOGUE ${PROJECT_BINARY_DIR}/catalogue.json)
add_custom_command(OUTPUT ${QX_CATALOGUE} ${PROJECT_BINARY_DIR}/exports.map
        ${PROJECT_BINARY_DIR}/exports.def ${PROJECT_BINARY_DIR}/exports.codes ${QX_UMBRELLA}
    COMMAND ${QX_PYTHON} ${PROJECT_SOURCE_DIR}/tools/catalogue.py ${PROJECT_SOURCE_DIR}/include
        --json ${QX_CATALOGUE} --map ${PROJECT_BINARY_DIR}/exports.map --def ${PROJECT_BINARY_DIR}/exports.def
        --codes ${PROJECT_BINARY_DIR}/exports.codes --umbrella ${QX_UMBRELLA} --version ${PROJECT_VERSION}
    DEPENDS ${QX_HEADERS} ${PROJECT_SOURCE_DIR}/tools/catalogue.py
    COMMENT "Reading the exports from the public headers" VERBATIM)
add_custom_target(catalogue ALL
    DEPENDS ${QX_CATALOGUE} ${PROJECT_BINARY_DIR}/exports.map ${PROJECT_BINARY_DIR}/exports.def
        ${PROJECT_BINARY_DIR}/exports.codes ${QX_UMBRELLA})

# The functions of the topics for C++, from the catalogue and the table of the Python topics.
set(QX_CPP_TOPICS ${PROJECT_BINARY_DIR}/include/qx/qx.hpp)
add_custom_command(OUTPUT ${QX_CPP_TOPICS}
    COMMAND ${QX_PYTHON} ${PROJECT_SOURCE_DIR}/tools/cpp_topics.py ${QX_CATALOGUE} ${QX_CPP_TOPICS}
    DEPENDS ${QX_CATALOGUE} ${PROJECT_SOURCE_DIR}/tools/cpp_topics.py
        ${PROJECT_SOURCE_DIR}/python/qx/topical/newest.py
    COMMENT "Writing the topics for C++" VERBATIM)
add_custom_target(cpp_topics ALL DEPENDS ${QX_CPP_TOPICS})
add_dependencies(cpp_topics catalogue)

# On Windows only functions marked for export are visible; elsewhere the linker gets a list.
function(qx_show_exports_only target)
    add_dependencies(${target} catalogue)
    if(NOT WIN32)
        target_link_options(${target} PRIVATE -Wl,--exclude-libs,ALL
            -Wl,--version-script=${PROJECT_BINARY_DIR}/exports.map)
        set_target_properties(${target} PROPERTIES LINK_DEPENDS ${PROJECT_BINARY_DIR}/exports.map)
    endif()
endfunction()

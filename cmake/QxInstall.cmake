# How other projects use the libraries: installed, by find_package(qxanalysis) or pkg-config, or as a
# subfolder, by add_subdirectory. The targets have the same names either way:
# qxanalysis::qxanalysis is the module, qxanalysis::qxrt the stand-in host.
include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

# The include folders for users of the libraries. qx/qx.h is in the build folder.
function(qx_public_headers target)
    target_include_directories(${target} SYSTEM INTERFACE
        "$<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include;${PROJECT_BINARY_DIR}/include>"
        $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
    target_compile_features(${target} INTERFACE c_std_11 cxx_std_20)
    add_library(qxanalysis::${target} ALIAS ${target})
endfunction()

function(qx_install)
    set(package ${CMAKE_INSTALL_LIBDIR}/cmake/qxanalysis)
    install(TARGETS qxanalysis qxrt EXPORT qxanalysis)
    install(EXPORT qxanalysis NAMESPACE qxanalysis:: FILE qxanalysisConfig.cmake DESTINATION ${package})
    write_basic_package_version_file(${PROJECT_BINARY_DIR}/qxanalysisConfigVersion.cmake
        COMPATIBILITY SameMajorVersion)
    install(FILES ${PROJECT_BINARY_DIR}/qxanalysisConfigVersion.cmake DESTINATION ${package})
    install(DIRECTORY ${PROJECT_SOURCE_DIR}/include/qx ${PROJECT_BINARY_DIR}/include/qx
        DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
    install(DIRECTORY ${QX_LICENCES} DESTINATION ${CMAKE_INSTALL_DOCDIR})
    install(FILES ${QX_CATALOGUE} DESTINATION ${CMAKE_INSTALL_DATADIR}/qxanalysis)
    if(NOT WIN32)
        set(QX_RUN_PATH "-Wl,-rpath,\${libdir} ")
    endif()
    configure_file(${PROJECT_SOURCE_DIR}/cmake/qxanalysis.pc.in qxanalysis.pc @ONLY)
    install(FILES ${PROJECT_BINARY_DIR}/qxanalysis.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
endfunction()

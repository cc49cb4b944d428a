# The installed package in three components: Runtime (the shared library and what loads with it), Development (headers,
# static library, find_package(kplib) and pkg-config files, printers for gdb) and Tools (see KplibTool.cmake). `uninstall`
# removes what the last installation wrote.

include(CMakePackageConfigHelpers)

install(TARGETS kplib EXPORT kplibTargets
        LIBRARY COMPONENT Runtime NAMELINK_COMPONENT Development
        ARCHIVE COMPONENT Development
        FILE_SET HEADERS COMPONENT Development)
install(EXPORT kplibTargets NAMESPACE kplib:: DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/kplib COMPONENT Development)

configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/kplibConfig.cmake.in kplibConfig.cmake
                              INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/kplib)
set(compatibility SameMajorVersion)
if(PROJECT_VERSION_MAJOR EQUAL 0)
    set(compatibility SameMinorVersion)
endif()
write_basic_package_version_file(kplibConfigVersion.cmake COMPATIBILITY ${compatibility})
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/kplibConfig.cmake ${CMAKE_CURRENT_BINARY_DIR}/kplibConfigVersion.cmake
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/kplib COMPONENT Development)

# kplib.pc finds its prefix by its own place, so that a moved installation still works.
set(pc_folder ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig)
cmake_path(RELATIVE_PATH CMAKE_INSTALL_PREFIX BASE_DIRECTORY ${pc_folder} OUTPUT_VARIABLE to_prefix)
cmake_path(RELATIVE_PATH CMAKE_INSTALL_FULL_LIBDIR BASE_DIRECTORY ${CMAKE_INSTALL_PREFIX} OUTPUT_VARIABLE libdir)
cmake_path(RELATIVE_PATH CMAKE_INSTALL_FULL_INCLUDEDIR BASE_DIRECTORY ${CMAKE_INSTALL_PREFIX} OUTPUT_VARIABLE includedir)
# A program that links a sanitizer's build links the sanitizer's runtime itself.
set(KPLIB_PC_LINK_OPTIONS)
if(KPLIB_SANITIZE)
    set(KPLIB_PC_LINK_OPTIONS " -fsanitize=${KPLIB_SANITIZE}")
endif()
configure_file(${PROJECT_SOURCE_DIR}/cmake/kplib.pc.in kplib.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/kplib.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT Development)

# gdb loads the printers with the library: it looks for the full name of the library's file below its auto-load folder. The
# prefix is known at installation only.
if(BUILD_SHARED_LIBS)
    cmake_path(RELATIVE_PATH CMAKE_INSTALL_FULL_LIBDIR BASE_DIRECTORY ${CMAKE_INSTALL_PREFIX} OUTPUT_VARIABLE lib_in_prefix)
    cmake_path(RELATIVE_PATH CMAKE_INSTALL_FULL_DATADIR BASE_DIRECTORY ${CMAKE_INSTALL_PREFIX} OUTPUT_VARIABLE data_in_prefix)
    install(CODE "
        file(INSTALL \"${PROJECT_SOURCE_DIR}/tools/gdb/kplib_printers.py\" RENAME libkplib.so.${PROJECT_VERSION}-gdb.py
             DESTINATION \"\${CMAKE_INSTALL_PREFIX}/${data_in_prefix}/gdb/auto-load\${CMAKE_INSTALL_PREFIX}/${lib_in_prefix}\")"
            COMPONENT Development)
endif()

if(PROJECT_IS_TOP_LEVEL)
    add_custom_target(uninstall COMMAND ${CMAKE_COMMAND} -P ${PROJECT_SOURCE_DIR}/cmake/Uninstall.cmake VERBATIM)
endif()

# The installed package: library, headers, find_package(kplib) and pkg-config files.

include(CMakePackageConfigHelpers)

install(TARGETS kplib EXPORT kplibTargets FILE_SET HEADERS)
install(EXPORT kplibTargets NAMESPACE kplib:: DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/kplib)

configure_package_config_file(cmake/kplibConfig.cmake.in kplibConfig.cmake
                              INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/kplib)
write_basic_package_version_file(kplibConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/kplibConfig.cmake ${PROJECT_BINARY_DIR}/kplibConfigVersion.cmake
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/kplib)

configure_file(cmake/kplib.pc.in kplib.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/kplib.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

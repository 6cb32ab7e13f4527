# cmake --install, find_package(MCOBNQRT) and pkg-config.
include(CMakePackageConfigHelpers)

set(packageDir ${CMAKE_INSTALL_LIBDIR}/cmake/MCOBNQRT)

install(TARGETS mcobnqrt EXPORT MCOBNQRTTargets)
install(DIRECTORY include/mcobnqrt DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(EXPORT MCOBNQRTTargets NAMESPACE MCOBNQRT:: DESTINATION ${packageDir})

configure_package_config_file(cmake/MCOBNQRTConfig.cmake.in MCOBNQRTConfig.cmake INSTALL_DESTINATION ${packageDir})
write_basic_package_version_file(MCOBNQRTConfigVersion.cmake COMPATIBILITY SameMajorVersion)
configure_file(cmake/mcobnqrt.pc.in mcobnqrt.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/MCOBNQRTConfig.cmake ${CMAKE_CURRENT_BINARY_DIR}/MCOBNQRTConfigVersion.cmake
        DESTINATION ${packageDir})
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/mcobnqrt.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

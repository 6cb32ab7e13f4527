# cmake --install, find_package(MCOBNQRT) and pkg-config.
include(CMakePackageConfigHelpers)

set(packageDir ${CMAKE_INSTALL_LIBDIR}/cmake/MCOBNQRT)

install(TARGETS mcobnqrt EXPORT MCOBNQRTTargets)
install(DIRECTORY include/mcobnqrt DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(EXPORT MCOBNQRTTargets NAMESPACE MCOBNQRT:: DESTINATION ${packageDir})

configure_package_config_file(cmake/MCOBNQRTConfig.cmake.in MCOBNQRTConfig.cmake INSTALL_DESTINATION ${packageDir})
write_basic_package_version_file(MCOBNQRTConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/MCOBNQRTConfig.cmake ${CMAKE_CURRENT_BINARY_DIR}/MCOBNQRTConfigVersion.cmake
        DESTINATION ${packageDir})

# The .pc file finds the prefix from its own place, so that the tree can be moved. libdir may have more than one level,
# as in lib/x86_64-linux-gnu, and it stays an absolute path if it was given as one.
file(RELATIVE_PATH prefixFromPkgConfig ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
string(REGEX REPLACE "/$" "" prefixFromPkgConfig ${prefixFromPkgConfig})
cmake_path(APPEND libdirForPkgConfig "\${prefix}" ${CMAKE_INSTALL_LIBDIR})
cmake_path(APPEND includedirForPkgConfig "\${prefix}" ${CMAKE_INSTALL_INCLUDEDIR})
configure_file(cmake/mcobnqrt.pc.in mcobnqrt.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/mcobnqrt.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

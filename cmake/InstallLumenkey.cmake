# What `cmake --install` lays down beside the headers: the shared library, find_package(lumenkey) with the
# target lumenkey::lumenkey, and lumenkey.pc.
include(CMakePackageConfigHelpers)

set(package_dir "${CMAKE_INSTALL_LIBDIR}/cmake/lumenkey")

install(TARGETS lumenkey EXPORT lumenkeyTargets
    LIBRARY DESTINATION "${CMAKE_INSTALL_LIBDIR}"
    FILE_SET public_headers DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}")
install(EXPORT lumenkeyTargets NAMESPACE lumenkey:: DESTINATION "${package_dir}")

# Before 1.0 a new minor version may break hosts, so a host gets only the one that it asked for.
write_basic_package_version_file(lumenkeyConfigVersion.cmake COMPATIBILITY SameMinorVersion)
configure_package_config_file("${PROJECT_SOURCE_DIR}/cmake/lumenkeyConfig.cmake.in" lumenkeyConfig.cmake
    INSTALL_DESTINATION "${package_dir}"
    NO_SET_AND_CHECK_MACRO)
install(FILES
    "${CMAKE_CURRENT_BINARY_DIR}/lumenkeyConfig.cmake"
    "${CMAKE_CURRENT_BINARY_DIR}/lumenkeyConfigVersion.cmake"
    DESTINATION "${package_dir}")

# The prefix in the file is found from where the file lies, so that an installed tree can be moved.
set(pkgconfig_dir "${CMAKE_INSTALL_LIBDIR}/pkgconfig")
file(RELATIVE_PATH PREFIX_FROM_PKGCONFIG_DIR "/${pkgconfig_dir}" "/")
string(REGEX REPLACE "/$" "" PREFIX_FROM_PKGCONFIG_DIR "${PREFIX_FROM_PKGCONFIG_DIR}")
configure_file("${PROJECT_SOURCE_DIR}/cmake/lumenkey.pc.in" lumenkey.pc @ONLY)
install(FILES "${CMAKE_CURRENT_BINARY_DIR}/lumenkey.pc" DESTINATION "${pkgconfig_dir}")

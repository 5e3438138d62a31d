# What other projects find the installation by: a CMake package and files for pkg-config.
include(CMakePackageConfigHelpers)

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/tessel)
install(EXPORT tessel NAMESPACE tessel:: FILE tessel-targets.cmake
    DESTINATION ${package_dir} COMPONENT development)
configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/tessel-config.cmake.in
    ${CMAKE_BINARY_DIR}/tessel-config.cmake
    INSTALL_DESTINATION ${package_dir}
    PATH_VARS CMAKE_INSTALL_LIBDIR)
write_basic_package_version_file(${CMAKE_BINARY_DIR}/tessel-config-version.cmake
    COMPATIBILITY SameMinorVersion)
install(FILES
    ${CMAKE_BINARY_DIR}/tessel-config.cmake
    ${CMAKE_BINARY_DIR}/tessel-config-version.cmake
    ${CMAKE_CURRENT_LIST_DIR}/tessel-add-module.cmake
    DESTINATION ${package_dir} COMPONENT development)

# Where it is installed is known when it is used: packages are made for another prefix than this.
file(RELATIVE_PATH to_prefix /${CMAKE_INSTALL_LIBDIR}/pkgconfig /)
string(REGEX REPLACE "/$" "" to_prefix ${to_prefix})
foreach(name tessel tessel-netcdf-guard)
    configure_file(${CMAKE_CURRENT_LIST_DIR}/${name}.pc.in ${CMAKE_BINARY_DIR}/${name}.pc @ONLY)
endforeach()
install(FILES ${CMAKE_BINARY_DIR}/tessel.pc ${CMAKE_BINARY_DIR}/tessel-netcdf-guard.pc
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT development)

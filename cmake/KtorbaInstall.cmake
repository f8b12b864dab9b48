# Installs what users build against: the two shared libraries, the public headers, and how to find them, for CMake
# (find_package(ktorba)) and for pkg-config. A component of its own, so that it can be installed without the rest.

include(CMakePackageConfigHelpers)

set(ktorba_package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/ktorba)

install(TARGETS ktorba ktorba_elaborating EXPORT ktorbaTargets COMPONENT library)
install(DIRECTORY ${KTORBA_SOURCE_ROOT}/include/ktorba DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT library
  FILES_MATCHING PATTERN "*.h")
install(EXPORT ktorbaTargets NAMESPACE ktorba:: DESTINATION ${ktorba_package_dir} COMPONENT library)

configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/ktorbaConfig.cmake.in
  ${CMAKE_CURRENT_BINARY_DIR}/ktorbaConfig.cmake INSTALL_DESTINATION ${ktorba_package_dir})
write_basic_package_version_file(${CMAKE_CURRENT_BINARY_DIR}/ktorbaConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/ktorbaConfig.cmake ${CMAKE_CURRENT_BINARY_DIR}/ktorbaConfigVersion.cmake
  DESTINATION ${ktorba_package_dir} COMPONENT library)

# The .pc files name the install prefix relative to themselves: an installed tree may be moved.
file(RELATIVE_PATH ktorba_prefix_from_pc /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
foreach(library IN ITEMS ktorba ktorba_elaborating)
  configure_file(${CMAKE_CURRENT_LIST_DIR}/ktorba.pc.in ${CMAKE_CURRENT_BINARY_DIR}/${library}.pc @ONLY)
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/${library}.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig
    COMPONENT library)
endforeach()

# Installs what users build against, and how to find it, for CMake (find_package(ktorba)) and for pkg-config: the two
# shared libraries with the public headers, as the component "library", which can be installed without the rest, and the
# simulated generator, as "simulator", which stands on it. The target `uninstall` removes what was installed.

include(CMakePackageConfigHelpers)

set(ktorba_package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/ktorba)
set(ktorba_headers ${KTORBA_SOURCE_ROOT}/include/ktorba)
set(ktorba_include_dir ${CMAKE_INSTALL_INCLUDEDIR}/ktorba)

install(TARGETS ktorba ktorba_elaborating ktorba_host_runtime EXPORT ktorbaTargets COMPONENT library)
install(DIRECTORY ${ktorba_headers}/ DESTINATION ${ktorba_include_dir} COMPONENT library
  FILES_MATCHING PATTERN "*.h" PATTERN simulator.h EXCLUDE PATTERN script_tools.h EXCLUDE)
install(FILES ${ktorba_headers}/simulator.h DESTINATION ${ktorba_include_dir} COMPONENT simulator)
install(EXPORT ktorbaTargets NAMESPACE ktorba:: DESTINATION ${ktorba_package_dir} COMPONENT library)
install(EXPORT ktorbaSimulatorTargets NAMESPACE ktorba:: DESTINATION ${ktorba_package_dir} COMPONENT simulator)

configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/ktorbaConfig.cmake.in
  ${CMAKE_CURRENT_BINARY_DIR}/ktorbaConfig.cmake INSTALL_DESTINATION ${ktorba_package_dir})
write_basic_package_version_file(${CMAKE_CURRENT_BINARY_DIR}/ktorbaConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/ktorbaConfig.cmake ${CMAKE_CURRENT_BINARY_DIR}/ktorbaConfigVersion.cmake
  DESTINATION ${ktorba_package_dir} COMPONENT library)

# ktorba_install_pc(name component description libs): a .pc file, which names the install prefix relative to itself: an
# installed tree may be moved.
file(RELATIVE_PATH ktorba_prefix_from_pc /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
function(ktorba_install_pc name component description libs)
  configure_file(${KTORBA_SOURCE_ROOT}/cmake/ktorba.pc.in ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc @ONLY)
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig
    COMPONENT ${component})
endfunction()

foreach(library IN ITEMS ktorba ktorba_elaborating ktorba_host_runtime)
  ktorba_install_pc(${library} library ${PROJECT_DESCRIPTION} "-l${library}")
endforeach()
if(NOT WIN32 AND NOT APPLE)
  set(keep -Wl,--push-state,--no-as-needed)
  set(drop -Wl,--pop-state)
  set(rpath "-Wl,-rpath,\${platformdir} -Wl,-rpath,\${libdir}")
endif()
ktorba_install_pc(ktorba_simulator simulator "Simulated generator for ${PROJECT_NAME}"
  "-lktorba_simulator -L\${platformdir} ${keep} -lKtFpga -lktifwu ${drop} ${rpath}")

if(PROJECT_IS_TOP_LEVEL)
  add_custom_target(uninstall
    COMMAND ${CMAKE_COMMAND} -DMANIFESTS=${CMAKE_BINARY_DIR} -P ${CMAKE_CURRENT_LIST_DIR}/uninstall.cmake VERBATIM)
endif()

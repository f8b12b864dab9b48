# `cmake --build build/win32 --target package` makes a ZIP for Windows: programs and DLLs, headers, import libraries for
# both usual compilers, the CMake package, documents, and the notices of what is linked in.

find_program(KTORBA_DLLTOOL NAMES llvm-dlltool ${CMAKE_DLLTOOL} REQUIRED)

# The import libraries of compilers that look for NAME.lib, from what the DLLs export.
foreach(library IN ITEMS ktorba ktorba_elaborating ktorba_host_runtime ktorba_simulator ktorba_tools KtFpga ktifwu)
  if(NOT TARGET ${library})
    continue()
  endif()
  set(exports ${CMAKE_BINARY_DIR}/importLibraries/${library})
  file(MAKE_DIRECTORY ${CMAKE_BINARY_DIR}/importLibraries)
  target_link_options(${library} PRIVATE LINKER:--output-def,${exports}.def)
  add_custom_command(OUTPUT ${exports}.lib DEPENDS ${library} VERBATIM
    COMMAND ${KTORBA_DLLTOOL} -m i386:x86-64 -d ${exports}.def -D $<TARGET_FILE_NAME:${library}> -l ${exports}.lib)
  list(APPEND import_libraries ${exports}.lib)
  set(folder ${CMAKE_INSTALL_LIBDIR})
  if(library MATCHES "^Kt|^ktifwu")
    set(folder ${KTORBA_SIMULATOR_LIBDIR})
  endif()
  install(FILES ${exports}.lib DESTINATION ${folder} COMPONENT library)
endforeach()
add_custom_target(ktorba_import_libraries ALL DEPENDS ${import_libraries})

install(FILES README.md CHANGELOG.md DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT tool)
install(DIRECTORY docs examples DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT tool)
# What is linked in, and the building system's word on its licence.
foreach(package IN ITEMS libboost-dev libutfcpp-dev libcli11-dev nlohmann-json3-dev gcc-mingw-w64-base
    mingw-w64-x86-64-dev)
  install(FILES /usr/share/doc/${package}/copyright DESTINATION ${CMAKE_INSTALL_DOCDIR}/notices RENAME ${package}.txt
    COMPONENT tool)
endforeach()

set(CPACK_GENERATOR ZIP)
set(CPACK_PACKAGE_FILE_NAME ktorba-${PROJECT_VERSION}-win64)
include(CPack)

# GoogleTest: the system's, or built from its sources where these are for another system than the one that builds.
if(NOT CMAKE_CROSSCOMPILING)
  find_package(GTest REQUIRED)
  return()
endif()
set(INSTALL_GTEST OFF)
add_subdirectory(${KTORBA_GOOGLETEST_SOURCES} ${CMAKE_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)

# Toolchain file: Debian's cross compiler for 64-bit Windows, with POSIX threads under std::thread. The libraries that
# it builds stand on those of Windows alone.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)

set(target x86_64-w64-mingw32)
set(CMAKE_C_COMPILER ${target}-gcc-posix)
set(CMAKE_CXX_COMPILER ${target}-g++-posix)
set(CMAKE_RC_COMPILER ${target}-windres)
set(CMAKE_SHARED_LINKER_FLAGS_INIT -static)
set(CMAKE_EXE_LINKER_FLAGS_INIT -static)

set(CMAKE_FIND_ROOT_PATH /usr/${target})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)

# Not those of the building system.
set(ENV{PKG_CONFIG_LIBDIR} /usr/${target}/lib/pkgconfig)

# Headers are the same for every system; these are the building one's. They are seen through a folder of their own: in
# /usr/include they stand beside the C library's.
set(KTORBA_HOST_HEADERS ${CMAKE_BINARY_DIR}/headers)
set(utf8cpp_DIR /usr/lib/${CMAKE_HOST_SYSTEM_PROCESSOR}-linux-gnu/cmake/utf8cpp)
set(Boost_NO_BOOST_CMAKE ON)
set(Boost_INCLUDE_DIR ${KTORBA_HOST_HEADERS})
set(CLI11_DIR ${CMAKE_CURRENT_LIST_DIR}/mingw)
set(nlohmann_json_DIR ${CMAKE_CURRENT_LIST_DIR}/mingw)
set(KTORBA_GOOGLETEST_SOURCES /usr/src/googletest)
get_property(trying GLOBAL PROPERTY IN_TRY_COMPILE)
if(NOT trying)
  file(MAKE_DIRECTORY ${KTORBA_HOST_HEADERS})
  foreach(folder IN ITEMS boost CLI nlohmann)
    file(CREATE_LINK /usr/include/${folder} ${KTORBA_HOST_HEADERS}/${folder} SYMBOLIC)
  endforeach()
endif()

# Programs run through Wine.
set(CMAKE_CROSSCOMPILING_EMULATOR ${CMAKE_CURRENT_LIST_DIR}/mingw/runInWine.sh ${CMAKE_BINARY_DIR})

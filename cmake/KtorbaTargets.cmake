# The functions that every folder's CMakeLists.txt is written in.

set(KTORBA_SOURCE_ROOT ${CMAKE_CURRENT_LIST_DIR}/..)
cmake_path(NORMAL_PATH KTORBA_SOURCE_ROOT)

# What every target of ours is compiled with.
add_library(ktorba_options INTERFACE)
target_compile_features(ktorba_options INTERFACE cxx_std_20 c_std_11)
if(CMAKE_CXX_COMPILER_ID MATCHES "GNU|Clang")
  target_compile_options(ktorba_options INTERFACE -Wall -Wextra -Wpedantic -Wconversion -Wshadow
    $<$<BOOL:${KTORBA_WARNINGS_AS_ERRORS}>:-Werror>)
endif()
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
  # These warn of std::string's own operator+ when it is inlined (GCC bug 105651).
  target_compile_options(ktorba_options INTERFACE -Wno-restrict)
endif()
# What is exported carries this decoration, so that everything else stays hidden.
if(WIN32)
  set(CMAKE_SHARED_LIBRARY_PREFIX "")  # whatever the compiler: the platform libraries are loaded as KtFpga.dll
  set(KTORBA_EXPORTED "__declspec(dllexport)")
  # Programs find the DLLs in their own folder.
  set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/bin)
else()
  set(KTORBA_EXPORTED "__attribute__((visibility(\"default\")))")
endif()
# The simulator's libraries of the platform's names are installed into a folder of their own: beside the others, every
# program would take them for the hardware's. Windows keeps DLLs under the folder of programs.
set(KTORBA_SIMULATOR_LIBDIR ${CMAKE_INSTALL_LIBDIR}/ktorba/simulator)
set(KTORBA_SIMULATOR_BINDIR ${CMAKE_INSTALL_BINDIR}/ktorba/simulator)

find_package(Threads REQUIRED)
find_package(Boost 1.74 REQUIRED)

# Lets `target` include the headers of this folder by their path from the root, "ktorba/waveform/WaveformTable.h",
# and with it every target that links it; nothing else is on its path. So an include of a module that a target does
# not link fails to build. (A link per module in the build tree does it; where the system has none, a copy.)
function(ktorba_expose_folder target visibility)
  cmake_path(RELATIVE_PATH CMAKE_CURRENT_SOURCE_DIR BASE_DIRECTORY ${KTORBA_SOURCE_ROOT} OUTPUT_VARIABLE folder)
  set(include_dir ${CMAKE_BINARY_DIR}/modules/${target})
  set(link ${include_dir}/${folder})
  if(NOT EXISTS ${link})
    cmake_path(GET link PARENT_PATH parent)
    file(MAKE_DIRECTORY ${parent})
    file(CREATE_LINK ${CMAKE_CURRENT_SOURCE_DIR} ${link} SYMBOLIC COPY_ON_ERROR)
  endif()
  target_include_directories(${target} ${visibility} ${include_dir})
endfunction()

# ktorba_add_module(name SOURCES a.cpp ... LINKS other ... [PRIVATE_LINKS lib ...])
# A static library of this folder's sources, position independent, for the shared libraries, tools and tests.
# Without SOURCES it is an interface library of headers.
function(ktorba_add_module name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LINKS;PRIVATE_LINKS")
  set_property(GLOBAL APPEND PROPERTY KTORBA_MODULES ${name})
  set_property(GLOBAL PROPERTY KTORBA_LINKS_OF_${name} ${arg_LINKS} ${arg_PRIVATE_LINKS})
  if(NOT arg_SOURCES)
    add_library(${name} INTERFACE)
    target_link_libraries(${name} INTERFACE ${arg_LINKS} ktorba_options)
    ktorba_expose_folder(${name} INTERFACE)
    return()
  endif()
  add_library(${name} STATIC ${arg_SOURCES})
  set_target_properties(${name} PROPERTIES POSITION_INDEPENDENT_CODE ON
    CXX_VISIBILITY_PRESET hidden C_VISIBILITY_PRESET hidden VISIBILITY_INLINES_HIDDEN ON)
  target_link_libraries(${name} PUBLIC ${arg_LINKS} PRIVATE ktorba_options ${arg_PRIVATE_LINKS})
  target_compile_features(${name} PUBLIC cxx_std_20)
  ktorba_expose_folder(${name} PUBLIC)
endfunction()

# Makes UTF-8 the encoding of a program's texts, where the system leaves that to programs.
function(ktorba_use_utf8 program)
  if(WIN32)
    target_sources(${program} PRIVATE ${KTORBA_SOURCE_ROOT}/platform/system/win32/utf8.rc)
  endif()
endfunction()

# Where tests run that were built for another system: ktorba_set_loader_path(test folder...) makes the folders those
# where the test finds its shared libraries, beside its program's own. Elsewhere programs know theirs.
include(NotUnderWine)
function(ktorba_set_loader_path test)
  if(WIN32)
    list(JOIN ARGN ":" folders)
    set_property(TEST ${test} APPEND PROPERTY ENVIRONMENT "LD_LIBRARY_PATH=${folders}")
  endif()
endfunction()

# ktorba_add_program_test(name command...): a test that runs one of our programs.
function(ktorba_add_program_test name)
  add_test(NAME ${name} COMMAND ${ARGN})
  if(WIN32)
    set_property(TEST ${name} APPEND PROPERTY ENVIRONMENT "GTEST_FILTER=-${KTORBA_NOT_UNDER_WINE}")
  endif()
endfunction()

# What cmake/readExports.cmake reads a library with.
if(WIN32)
  set(KTORBA_SYMBOL_READER -DOBJDUMP=${CMAKE_OBJDUMP})
else()
  set(KTORBA_SYMBOL_READER -DNM=${CMAKE_NM})
endif()

# The tests labelled "threads", which is what the thread sanitizer has to say something about.
add_custom_target(threaded_tests)

# ktorba_add_test(name [THREADS] SOURCES a_test.cpp ... LINKS module ...)
# A GoogleTest program, run whole as one test of its name. THREADS: it starts threads of its own.
# What tests share, testing/, is linked to all of them; first, since it calls what some of them link.
function(ktorba_add_test name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "THREADS" "" "SOURCES;LINKS")
  add_executable(${name} ${arg_SOURCES})
  target_link_libraries(${name} PRIVATE ktorba_options ktorba_testing ${arg_LINKS} GTest::gmock GTest::gtest_main)
  ktorba_use_utf8(${name})
  ktorba_add_program_test(${name} ${name})
  set(doubles ${arg_LINKS})
  list(FILTER doubles INCLUDE REGEX "_double$")
  if(doubles)
    list(TRANSFORM doubles REPLACE ".+" "$<TARGET_FILE_DIR:\\0>")
    ktorba_set_loader_path(${name} ${doubles})
  endif()
  if(arg_THREADS)
    set_tests_properties(${name} PROPERTIES LABELS threads)
    add_dependencies(threaded_tests ${name})
  endif()
endfunction()

# ktorba_add_page_test(name FILE path PROGRAM target [ARGUMENTS argument ...])
# Tells when a file of this repository is not what a program of it prints.
function(ktorba_add_page_test name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "FILE;PROGRAM" "ARGUMENTS")
  add_test(NAME ${name} COMMAND ${CMAKE_COMMAND}
    "-DPROGRAM=${CMAKE_CROSSCOMPILING_EMULATOR};$<TARGET_FILE:${arg_PROGRAM}>" "-DARGUMENTS=${arg_ARGUMENTS}"
    -DFILE=${KTORBA_SOURCE_ROOT}/${arg_FILE} -P ${KTORBA_SOURCE_ROOT}/cmake/checkPage.cmake)
endfunction()

add_custom_target(benchmarks)

# ktorba_add_benchmark(name SOURCES a_benchmark.cpp ... LINKS module ...)
# A Google Benchmark program with main() of its own accord.
function(ktorba_add_benchmark name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LINKS")
  add_executable(${name} ${arg_SOURCES})
  target_link_libraries(${name} PRIVATE ktorba_options ${arg_LINKS} benchmark::benchmark benchmark::benchmark_main)
  add_dependencies(benchmarks ${name})
endfunction()

# ktorba_add_simulator_test(name [DEVICE] [WITHOUT_RUNTIME] LIBRARY ktorba|ktorba_elaborating SOURCES a_test.cpp ...
#   [LINKS module ...])
# A test of whole sessions on the simulated generator. The platform libraries are linked in although nothing refers to
# them: the library finds them loaded. DEVICE: it plays on other devices, too, and has the label "device"; it runs once
# more on one that is there from the start, with platform libraries and session numbers given as CONTRIBUTING.md says.
# WITHOUT_RUNTIME: nobody announces a host runtime.
function(ktorba_add_simulator_test name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "DEVICE;WITHOUT_RUNTIME" "LIBRARY" "SOURCES;LINKS")
  ktorba_add_test(${name} SOURCES ${arg_SOURCES} LINKS ${arg_LINKS} ${arg_LIBRARY} ktorba_simulator KtFpga ktifwu)
  target_link_options(${name} PRIVATE "LINKER:--no-as-needed")
  if(MINGW)
    # A function of each, or the program is not linked with them.
    target_link_options(${name} PRIVATE "LINKER:--undefined=KtFpgaDll_StartFifo,--undefined=ktIFW_Target_Reset")
  endif()
  if(arg_LIBRARY AND NOT arg_WITHOUT_RUNTIME)
    target_sources(${name} PRIVATE ${KTORBA_SOURCE_ROOT}/testing/announceHostRuntime.cpp)
    target_link_libraries(${name} PRIVATE ktorba_host_runtime)
  endif()
  if(arg_DEVICE)
    set_tests_properties(${name} PROPERTIES LABELS device)
    ktorba_add_program_test(${name}_on_other_device ${name})
    set(folders $<TARGET_FILE_DIR:ktorba_present_device>:$<TARGET_FILE_DIR:ktifwu>)
    set_property(TEST ${name}_on_other_device APPEND PROPERTY
      ENVIRONMENT "LD_LIBRARY_PATH=${folders};KTORBA_DEVICE=1,0x80000001,0x40000001,1,0")
    add_dependencies(${name} ktorba_present_device)
  endif()
endfunction()

# ktorba_add_sessions_test(name): the sessions in this folder's sessions/, told as text (testing/TextSession.h).
function(ktorba_add_sessions_test name)
  ktorba_add_simulator_test(${name} LIBRARY ktorba_elaborating SOURCES ${KTORBA_SOURCE_ROOT}/testing/sessions_test.cpp)
  target_compile_definitions(${name} PRIVATE KTORBA_GOLDEN_FOLDER="${CMAKE_CURRENT_SOURCE_DIR}/sessions")
endfunction()

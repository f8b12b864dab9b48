# The building system's headers, without its folder of all headers.
add_library(CLI11::CLI11 INTERFACE IMPORTED)
target_include_directories(CLI11::CLI11 INTERFACE ${KTORBA_HOST_HEADERS})

# The building system's headers, without its folder of all headers.
add_library(nlohmann_json::nlohmann_json INTERFACE IMPORTED)
target_include_directories(nlohmann_json::nlohmann_json INTERFACE ${KTORBA_HOST_HEADERS})

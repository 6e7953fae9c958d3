# CLI11::CLI11. It is headers alone, so where the compiler builds for another system than this one, and
# looks at none of this one's folders, its headers can be taken from here all the same.
if(CMAKE_CROSSCOMPILING AND NOT TARGET CLI11::CLI11)
  find_path(SIMGP_CLI11 CLI/CLI.hpp PATHS /usr/include /usr/local/include NO_DEFAULT_PATH NO_CMAKE_FIND_ROOT_PATH)
  if(SIMGP_CLI11)
    # A folder of its own: the system's would bring the headers of its C library.
    file(MAKE_DIRECTORY ${PROJECT_BINARY_DIR}/cli11)
    file(CREATE_LINK ${SIMGP_CLI11}/CLI ${PROJECT_BINARY_DIR}/cli11/CLI SYMBOLIC)
    add_library(CLI11::CLI11 INTERFACE IMPORTED)
    target_include_directories(CLI11::CLI11 SYSTEM INTERFACE ${PROJECT_BINARY_DIR}/cli11)
  endif()
endif()
if(NOT TARGET CLI11::CLI11)
  find_package(CLI11 REQUIRED)
endif()

# GTest::gtest_main. Debian's package googletest holds the sources, which every compiler, processor and
# sanitizer can build; elsewhere an installed GoogleTest will do.
set(SIMGP_GOOGLETEST /usr/src/googletest CACHE PATH "Sources of GoogleTest, built with the tests")
if(EXISTS ${SIMGP_GOOGLETEST}/CMakeLists.txt)
  set(BUILD_GMOCK OFF CACHE BOOL "" FORCE)
  set(INSTALL_GTEST OFF CACHE BOOL "" FORCE)
  add_subdirectory(${SIMGP_GOOGLETEST} ${PROJECT_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)
else()
  find_package(GTest REQUIRED)
endif()

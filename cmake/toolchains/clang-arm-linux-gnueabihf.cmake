# 32-bit ARM Linux by Clang, with the libraries of Debian's GCC for it: the compiler and the instructions of
# Android's armeabi-v7a, NEON in the vector rows alone.
include(${CMAKE_CURRENT_LIST_DIR}/arm-linux-gnueabihf.cmake)
set(CMAKE_C_COMPILER clang)
set(CMAKE_CXX_COMPILER clang++)
set(CMAKE_C_COMPILER_TARGET arm-linux-gnueabihf)
set(CMAKE_CXX_COMPILER_TARGET arm-linux-gnueabihf)

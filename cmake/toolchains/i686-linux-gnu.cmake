# 32-bit x86 Linux as Debian has it; no SSE in baseline code, so that the vector rows alone are compiled
# with it.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR i686)
set(CMAKE_C_COMPILER i686-linux-gnu-gcc)
set(CMAKE_CXX_COMPILER i686-linux-gnu-g++)

list(APPEND CMAKE_FIND_ROOT_PATH /usr/i686-linux-gnu)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# x86-64 processors run it as it is; the loader and the libraries are those of the cross compiler.
set(lib /usr/i686-linux-gnu/lib)
set(CMAKE_CROSSCOMPILING_EMULATOR ${lib}/ld-linux.so.2 --library-path ${lib})

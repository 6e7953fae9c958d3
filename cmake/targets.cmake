# The instruction sets that the processor family can have, and their compiler flags. Only the vector rows
# are compiled with them; everything else is baseline code.
set(SIMGP_TARGETS "")
string(TOLOWER "${CMAKE_SYSTEM_PROCESSOR}" processor)
# The vector layer counts on little-endian memory. The names are for compilers whose order CMake cannot tell.
if(CMAKE_CXX_BYTE_ORDER STREQUAL "BIG_ENDIAN" OR processor MATCHES "^(aarch64_be|arm64_be|armeb|armv[0-9]+b)")
  set(SIMGP_BIG_ENDIAN ON)
else()
  set(SIMGP_BIG_ENDIAN OFF)
endif()
if(SIMGP_VECTOR AND SIMGP_BIG_ENDIAN)
  message(STATUS "simgp: '${CMAKE_SYSTEM_PROCESSOR}' is big-endian, scalar rows only")
elseif(SIMGP_VECTOR)
  if(processor MATCHES "^(x86_64|amd64|i[3-6]86|x86)$")
    set(SIMGP_TARGETS sse41 avx2 avx512)
  elseif(processor MATCHES "^(aarch64|arm64)")
    set(SIMGP_TARGETS neon)
  elseif(processor MATCHES "^arm")
    set(SIMGP_TARGETS neon)
    set(neon_flags -mfpu=neon)
  else()
    message(STATUS "simgp: no vector rows for '${CMAKE_SYSTEM_PROCESSOR}', scalar rows only")
  endif()
endif()
include(CheckCXXCompilerFlag)
set(sse41_flags -msse4.1)
set(avx2_flags -mavx2)
set(avx512_flags -mavx512f -mavx512bw -mavx512dq -mavx512vl -mavx512vbmi -mprefer-vector-width=512)
# False warnings from the intrinsics header of GCC 12 and older.
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
  list(APPEND avx512_flags -Wno-uninitialized -Wno-maybe-uninitialized)
endif()
# Windows aligns stacks to 16 bytes, and GCC for it takes the slots where it keeps wide registers for aligned
# (its bug 54412). The assembler then writes moves that do without. Some builds of GCC do so themselves.
if(WIN32 AND CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND SIMGP_TARGETS)
  set(unaligned_moves -Wa,-muse-unaligned-vector-move)
  check_cxx_compiler_flag(${unaligned_moves} SIMGP_HAS_UNALIGNED_MOVES)
  if(NOT SIMGP_HAS_UNALIGNED_MOVES)
    message(FATAL_ERROR "simgp: the assembler is too old for AVX2 on Windows (binutils 2.38 has what it takes). "
                        "Set SIMGP_VECTOR to OFF, or take another one.")
  endif()
  list(APPEND avx2_flags ${unaligned_moves})
  list(APPEND avx512_flags ${unaligned_moves})
endif()
message(STATUS "simgp: vector rows for: ${SIMGP_TARGETS}")

# The areas that have rows: families of inner loops with a header (rows/<area>.h), scalar rows
# (<family>/<area>.cpp) and vector rows (<family>/vector/<area>.h). The code gets the list as the macro
# SIMGP_AREAS(X).
set(SIMGP_AREAS
  scmn/keyframe
  scmn/mem
  simgp/any
  simgp/deblock
  simgp/dither
  simgp/layout
  simgp/resize
  simgp/rgb2yuv
  simgp/rotate
  simgp/tile
  simgp/yuv2rgb)
# Areas whose rows gain nothing by -O3: their loops are written out, and it only makes copies of them.
set(SIMGP_SMALL_AREAS simgp/any simgp/layout simgp/resize simgp/rgb2yuv simgp/yuv2rgb)
# Areas whose rows go from line to line: GCC would keep the pointers of a line in vectors, and take them out
# again one by one.
set(SIMGP_AREAS_OF_LINES simgp/any simgp/yuv2rgb)
set(SIMGP_SMALL_AREAS_neon scmn/mem simgp/dither)
# Areas of loops so short that on x86 it shows, by a third, where they lie in their lines of the cache.
set(SIMGP_ALIGNED_AREAS scmn/keyframe)
set(area_macro "#define SIMGP_AREAS(X)")
foreach(area IN LISTS SIMGP_AREAS)
  get_filename_component(stem ${area} NAME)
  string(APPEND area_macro " X(${stem})")
endforeach()
file(CONFIGURE OUTPUT ${PROJECT_BINARY_DIR}/generated/areas.h CONTENT "${area_macro}\n")

# One object library per target and area, listed in SIMGP_VECTOR_UNITS; `chooser` learns which targets exist.
function(simgp_add_vector_unit name target area)
  get_filename_component(family ${area} DIRECTORY)
  get_filename_component(stem ${area} NAME)
  add_library(${name} OBJECT ${PROJECT_SOURCE_DIR}/rows/unit.cpp)
  target_link_libraries(${name} PRIVATE simgp_library_flags)
  target_compile_definitions(${name} PRIVATE SIMD_TARGET=${target} SIMD_LAYER="simd/${target}.h"
                                             SIMD_AREA="${family}/vector/${stem}.h")
  target_compile_options(${name} PRIVATE ${${target}_flags})
  if(area IN_LIST SIMGP_AREAS_OF_LINES)
    target_compile_options(${name} PRIVATE -fno-tree-slp-vectorize)
  endif()
  if(area IN_LIST SIMGP_ALIGNED_AREAS AND NOT target STREQUAL neon)
    target_compile_options(${name} PRIVATE -falign-functions=64 -falign-loops=64)
  endif()
  if(area IN_LIST SIMGP_SMALL_AREAS OR area IN_LIST SIMGP_SMALL_AREAS_${target})
    target_compile_options(${name} PRIVATE $<$<CONFIG:Release>:-O2>)
  endif()
  set_target_properties(${name} PROPERTIES POSITION_INDEPENDENT_CODE ON CXX_VISIBILITY_PRESET hidden
                                           VISIBILITY_INLINES_HIDDEN ON CXX_EXTENSIONS OFF)
endfunction()

function(simgp_add_vector_rows chooser)
  foreach(target IN LISTS SIMGP_TARGETS)
    target_compile_definitions(${chooser} PRIVATE SIMGP_HAVE_${target})
    foreach(area IN LISTS SIMGP_AREAS)
      string(REPLACE "/" "_" unit simgp_${target}_${area})
      simgp_add_vector_unit(${unit} ${target} ${area})
      list(APPEND units ${unit})
    endforeach()
  endforeach()
  set(SIMGP_VECTOR_UNITS ${units} PARENT_SCOPE)
endfunction()

# The vector layers count on little-endian memory: a big-endian ARM gets scalar rows, by whichever of its two
# marks it is known, and vector rows that are forced on it do not compile.
. "$(dirname "$0")/gate.sh" "$1"

cat >"$scratch/toolchain.cmake" <<END
include($toolchain)
set(CMAKE_TRY_COMPILE_TARGET_TYPE STATIC_LIBRARY) # there is no big-endian C library here to link with
string(APPEND CMAKE_CXX_FLAGS_INIT " \$ENV{ORDER}")
if(NOT "\$ENV{NAME}" STREQUAL "")
  set(CMAKE_SYSTEM_PROCESSOR \$ENV{NAME})
endif()
END
# units NAME ORDER: how many units of vector rows a processor of that name gets from a compiler of that order.
units() {
    rm -rf "$scratch/build"
    NAME=$1 ORDER=$2 "$cmake" -G Ninja -S "$source_dir" -B "$scratch/build" -DCMAKE_EXPORT_COMPILE_COMMANDS=ON \
        -DCMAKE_TOOLCHAIN_FILE="$scratch/toolchain.cmake" -DSIMGP_BUILD_TESTS=OFF -DSIMGP_BUILD_TOOLS=OFF \
        -DSIMGP_BUILD_BENCH=OFF >"$scratch/log" 2>&1 || {
        cat "$scratch/log" >&2
        return
    }
    grep '"command"' "$scratch/build/compile_commands.json" | grep -c SIMD_TARGET=neon
}
command -v ninja >/dev/null || skip "ninja is missing."

[ "$(units "" -mbig-endian)" = 0 ] || fault "A big-endian compiler gets vector rows."
for name in aarch64_be armeb armv7b; do
    [ "$(units $name "")" = 0 ] || fault "$name gets vector rows."
done
[ "$(units "" "")" -gt 0 ] || fault "The little-endian processor gets no vector rows."

# Of the C library's headers, the one that is there for big-endian programs alone.
mkdir -p "$scratch/include/gnu"
touch "$scratch/include/gnu/stubs-lp64_be.h"
compile=$(grep '"command"' "$scratch/build/compile_commands.json" | grep -m 1 SIMD_TARGET=neon |
    sed -E 's/^ *"command": "(.*)",$/\1/; s/\\"/"/g; s/\\\\/\\/g')
for order in little big; do
    (cd "$scratch/build" && eval "$compile -fsyntax-only -I'$scratch/include' -m$order-endian") >"$scratch/$order" 2>&1
    echo $? >"$scratch/$order.status"
done
grep -qx 0 "$scratch/little.status" || fault "A unit of vector rows does not compile:" "$(cat "$scratch/little")"
grep -q 'error:.*little-endian' "$scratch/big" ||
    fault "Forced on a big-endian processor, vector rows are not refused:" "$(head -n 20 "$scratch/big")"
finish

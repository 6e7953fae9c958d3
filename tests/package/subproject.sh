# As a part of a larger project the library asks for nothing, brings nothing but itself, and is built the way
# that project is. The build is one for debugging: no code may count on the optimiser.
. "$(dirname "$0")/gate.sh" "$1"

launcher=$(sed -n 's/^CMAKE_CXX_COMPILER_LAUNCHER:[A-Z]*=//p' "$build_dir/CMakeCache.txt")
# logged COMMAND: ends the test if it fails.
logged() {
    "$@" >"$scratch/log" 2>&1 || {
        cat "$scratch/log"
        exit 1
    }
}
configure() { # FOLDER [ARG ...]
    logged "$cmake" -G "$generator" -S "$source_dir/tests/package/superproject" -B "$scratch/$1" "${@:2}" \
        -DSIMGP_SOURCE="$source_dir" -DCMAKE_C_COMPILER="$cc" -DCMAKE_CXX_COMPILER="$cxx" \
        -DCMAKE_C_COMPILER_LAUNCHER="$launcher" -DCMAKE_CXX_COMPILER_LAUNCHER="$launcher"
}
build() { logged "$cmake" --build "$scratch/$1" --parallel 2 "${@:2}"; } # FOLDER [ARG ...]
# check_build KINDS: builds; the program works, and these kinds of library are there, no others.
check_build() {
    rm -f "$scratch"/build/simgp/libsimgp.*[ao]
    build build
    "$scratch/build/superproject" || fault "The superproject's program failed, with $1 libraries."
    local kinds
    kinds=$(cd "$scratch/build/simgp" && find . -name 'libsimgp.*[ao]' | sed 's/.*\.//' | sort | xargs)
    [ "$kinds" = "$1" ] || fault "Built were libraries '$kinds', not '$1'."
}
installed() { # FOLDER: what is installed
    logged "$cmake" --install "$scratch/build" --prefix "$scratch/$1"
    (cd "$scratch/$1" && find . ! -type d | sort)
}

configure build -DCMAKE_BUILD_TYPE=Debug
check_build "a so"
for option in BUILD_TESTS BUILD_TOOLS BUILD_BENCH INSTALL; do
    grep -q "^SIMGP_$option:BOOL=OFF" "$scratch/build/CMakeCache.txt" ||
        fault "SIMGP_$option is not off in a subproject."
done
files=$(installed plain)
[ "$files" = ./bin/superproject ] || fault "Installed with the superproject:" "$files"

# One kind of library goes by the general name, whichever it is, in the build and in what is installed.
configure build -DBUILD_SHARED_LIBS=ON
check_build so
configure build -DBUILD_SHARED_LIBS=OFF -DSIMGP_INSTALL=ON
check_build a
"$readelf" -d "$scratch/build/superproject" | grep -q libsimgp && fault "The program needs a library that is not built."
files=$(installed static)
grep -q '\.a$' <<<"$files" || fault "With SIMGP_INSTALL there is no library in:" "$files"
logged "$cmake" -G "$generator" -S "$source_dir/tests/package/user" -B "$scratch/user" \
    -DCMAKE_PREFIX_PATH="$scratch/static" -DCMAKE_C_COMPILER="$cc"
logged "$cmake" --build "$scratch/user"
"$scratch/user/user_shared" || fault "The program of a user of the static library failed."

# Without a build type the library is optimised and the project around it is not; what the flags of the
# project say, goes.
levels() { # FOLDER FILES: the levels that they are compiled with
    grep '"command"' "$scratch/$1/compile_commands.json" | grep -E -- "-c .*$2" |
        sed -E 's/.* (-O[^ ]*) .*/\1/; t; s/.*/none/' | sort -u | xargs
}
library='/(simgp|scmn|simd|rows)/[a-z0-9]+\.cpp'
check_levels() { # FOLDER LEVELS
    [ "$(levels "$1" "$library")" = "$2" ] || fault "$1: the library is compiled with $(levels "$1" "$library"), not $2."
}
configure untyped -DCMAKE_EXPORT_COMPILE_COMMANDS=ON
check_levels untyped -O3
[ "$(levels untyped user.c)" = none ] || fault "The superproject's program is compiled with $(levels untyped user.c)."
configure flagged -DCMAKE_EXPORT_COMPILE_COMMANDS=ON -DCMAKE_CXX_FLAGS=-Og
check_levels flagged -Og
configure build -DCMAKE_EXPORT_COMPILE_COMMANDS=ON
check_levels build none

# All sources in one, without a warning.
configure unity -DCMAKE_BUILD_TYPE=Debug -DCMAKE_UNITY_BUILD=ON -DCMAKE_UNITY_BUILD_BATCH_SIZE=0 \
    -DCMAKE_CXX_FLAGS=-Werror
build unity --target simgp_objects
[ "$(find "$scratch/unity" -name 'unity_*.o' | wc -l)" = 1 ] || fault "The unity build is none."
finish

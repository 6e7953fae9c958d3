# As a part of a larger project the library asks for nothing and brings nothing but itself. The build is
# one for debugging: no code may count on the optimiser.
. "$(dirname "$0")/gate.sh" "$1"

launcher=$(sed -n 's/^CMAKE_CXX_COMPILER_LAUNCHER:[A-Z]*=//p' "$build_dir/CMakeCache.txt")
"$cmake" -G "$generator" -S "$source_dir/tests/package/superproject" -B "$scratch/build" -DSIMGP_SOURCE="$source_dir" \
    -DCMAKE_BUILD_TYPE=Debug -DCMAKE_C_COMPILER="$cc" -DCMAKE_CXX_COMPILER="$cxx" \
    ${launcher:+-DCMAKE_C_COMPILER_LAUNCHER="$launcher" -DCMAKE_CXX_COMPILER_LAUNCHER="$launcher"} \
    >"$scratch/log" 2>&1 && "$cmake" --build "$scratch/build" --parallel 2 >>"$scratch/log" 2>&1 || {
    cat "$scratch/log"
    exit 1
}
for option in TESTS TOOLS BENCH; do
    grep -q "^SIMGP_BUILD_$option:BOOL=OFF" "$scratch/build/CMakeCache.txt" ||
        fault "SIMGP_BUILD_$option is not off in a subproject."
done
"$scratch/build/superproject" || fault "The superproject's program failed."
finish

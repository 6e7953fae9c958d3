# No code that is compiled with newer instructions may be taken for baseline code: whatever a unit of
# vector rows shows to the linker lies in the namespace of its target. Where i686 code asks for its own address,
# the compiler adds thunks of two old instructions, the same everywhere.
. "$(dirname "$0")/gate.sh" "$1"

# With "Debug" the units are those of a build for debugging, where nothing is inlined: a function that the
# optimiser leaves no trace of shows there.
if [ "${2:-}" = Debug ]; then
    launcher=$(sed -n 's/^CMAKE_CXX_COMPILER_LAUNCHER:[A-Z]*=//p' "$build_dir/CMakeCache.txt")
    targets=$(grep -o 'simgp_[a-z0-9_]*\.dir/' <<<"$units" | sed 's/\.dir.*//' | sort -u)
    # shellcheck disable=SC2086
    "$cmake" -G "$generator" -S "$source_dir" -B "$scratch/debug" -DCMAKE_BUILD_TYPE=Debug -DSIMGP_BUILD_TESTS=OFF \
        -DSIMGP_BUILD_TOOLS=OFF -DSIMGP_BUILD_BENCH=OFF -DCMAKE_C_COMPILER="$cc" -DCMAKE_CXX_COMPILER="$cxx" \
        -DCMAKE_CXX_COMPILER_LAUNCHER="$launcher" >"$scratch/log" 2>&1 &&
        "$cmake" --build "$scratch/debug" --parallel 2 --target $targets >>"$scratch/log" 2>&1 || {
        cat "$scratch/log"
        exit 1
    }
    units=${units//"$build_dir"/"$scratch/debug"} build_dir=$scratch/debug
fi

thunks='__x86\.get_pc_thunk\.[a-z]+$'
checked=0
while read -r target unit_objects; do
    [ -n "$target" ] || continue
    for object in $unit_objects; do
        leaks=$("$nm" --defined-only "$object" | awk '$2 ~ /[A-Zuvw]/ { print $2, $3 }' |
            grep -vE "^. (_Z(GV)?Z*NK?5simgp${#target}$target|$thunks)")
        [ -z "$leaks" ] || fault "${object#"$build_dir"/} defines, outside simgp::$target:" "$leaks"
        # Groups of sections are merged by name across the whole program. PE names them after what they define.
        [ "$library_kind" = ELF ] || { checked=$((checked + 1)) && continue; }
        groups=$("$readelf" -gW "$object" | sed -n 's/.*group section.*\[\([^]]*\)\] contains.*/\1/p' |
            grep -vE "^_Z+N?K?5simgp${#target}$target|^$thunks")
        [ -z "$groups" ] || fault "${object#"$build_dir"/} shares, outside simgp::$target:" "$groups"
        checked=$((checked + 1))
    done
done <<<"$units"
[ $checked -gt 0 ] || skip "This build has no vector rows."
finish

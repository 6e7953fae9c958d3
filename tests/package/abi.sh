# The binary interface is that of the release: abidiff finds nothing between the stored dump
# (cmake/abi/libsimgp.abi) and the library as it is now. Usage: abi.sh SETTINGS [renew]
#
# With `renew` the dump and the stored header (cmake/abi/simgp-1.0.h) are written anew. Both can only
# grow: what takes something away needs another major version, and the old files removed by hand.
. "$(dirname "$0")/gate.sh" "$1"
renew=${2:-}

dump=$source_dir/cmake/abi/libsimgp.abi header=$source_dir/cmake/abi/simgp-1.0.h
command -v abidw >/dev/null && command -v abidiff >/dev/null || skip "abigail-tools is missing."
[ "$(uname -m)" = x86_64 ] || skip "The dump is one of x86-64."

# The interface does not depend on the optimiser or on vector rows.
{
    "$cmake" -G "$generator" -S "$source_dir" -B "$scratch/build" -DCMAKE_BUILD_TYPE=Debug -DSIMGP_VECTOR=OFF \
        -DCMAKE_C_COMPILER="$cc" -DCMAKE_CXX_COMPILER="$cxx" -DBUILD_SHARED_LIBS=ON \
        -DCMAKE_CXX_FLAGS="$cxx_flags -ffile-prefix-map=$source_dir/=" -DSIMGP_BUILD_TESTS=OFF \
        -DSIMGP_BUILD_TOOLS=OFF -DSIMGP_BUILD_BENCH=OFF &&
        "$cmake" --build "$scratch/build" --target simgp_shared --parallel 2 &&
        abidw --exported-interfaces-only --no-corpus-path --no-show-locs --no-comp-dir-path --no-elf-needed \
            --type-id-style hash --out-file "$scratch/now.abi" "$scratch/build/libsimgp.so"
} >"$scratch/log" 2>&1 || {
    cat "$scratch/log"
    exit 1
}
functions=$(grep -c '<function-decl' "$scratch/now.abi")
[ "$functions" -ge 170 ] || fault "The dump has $functions functions, which are too few to be all."

if [ -z "$renew" ] || [ -f "$dump" ]; then
    difference=$(abidiff "$dump" "$scratch/now.abi" 2>&1)
    status=$?
    if [ -z "$renew" ]; then
        [ $status -eq 0 ] ||
            fault "Another interface than that of cmake/abi/libsimgp.abi (./run abi takes additions over):" "$difference"
        finish
    fi
    # In the summaries, "0 Removed, 0 Changed" and whatever was added.
    if grep -E 'changes summary:' <<<"$difference" | grep -qvE 'summary: 0 Removed(.*), 0 Changed(.*), [0-9]+ Added' ||
        [ $((status & 11)) -ne 0 ]; then
        printf '%s\n' "$difference" "More than additions: cmake/abi/libsimgp.abi stays as it is."
        exit 1
    fi
    [ -z "$difference" ] || printf '%s\n' "$difference"
fi
[ $broken -eq 0 ] || exit 1

# The public headers in one, without comments, in the order in which they need each other. Inline functions
# become a part of the programs that use them, and of no interface.
flat() { # HEADER
    case " simgp/describe.h $seen " in *" $1 "*) return ;; esac
    seen+=" $1"
    local inner
    for inner in $(sed -n 's/^#include "\(.*\)"$/\1/p' "$source_dir/$1"); do flat "$inner"; done
    "$cc" -w -fpreprocessed -dD -E -P "$source_dir/$1" | grep -v '^#include "'
}
mkdir -p "$(dirname "$dump")"
cp "$scratch/now.abi" "$dump"
seen=
{
    echo "/* The public headers of the release in one, for tests/package/oldheader.sh; ./run abi writes it. */"
    echo "/* clang-format off */"
    flat scmn/scmn.h
    flat simgp/simgp.h
} >"$header"
echo "Written: ${dump#"$source_dir/"} and ${header#"$source_dir/"}, with $functions functions."

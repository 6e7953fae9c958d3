# Two builds of one moment (SOURCE_DATE_EPOCH), of sources in different folders, give the same bytes, debug
# information included.
. "$(dirname "$0")/gate.sh" "$1"

command -v ninja >/dev/null || skip "ninja is missing."
export SOURCE_DATE_EPOCH=1291387660
# Each folder's objects are compiled there, or were before: nothing of the other may be taken.
unset CCACHE_BASEDIR CCACHE_NOHASHDIR
launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_C_COMPILER_LAUNCHER=ccache -DCMAKE_CXX_COMPILER_LAUNCHER=ccache)
place=$build_dir/reproducible
rm -rf "$place"
folders="$place/one $place/another/and/deeper"
for folder in $folders; do
    mkdir -p "$folder/sources"
    (cd "$source_dir" && tar -c CMakeLists.txt cmake rows scmn simd simgp docs/fingerprints.txt) |
        tar -x -C "$folder/sources"
    {
        "$cmake" -G Ninja -S "$folder/sources" -B "$folder/objects" "${launcher[@]}" -DCMAKE_BUILD_TYPE=Release \
            ${toolchain:+-DCMAKE_TOOLCHAIN_FILE="$toolchain"} -DCMAKE_C_COMPILER="$cc" \
            -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_CXX_FLAGS="$cxx_flags -g" -DSIMGP_BUILD_TESTS=OFF \
            -DSIMGP_BUILD_TOOLS=OFF -DSIMGP_BUILD_BENCH=OFF &&
            "$cmake" --build "$folder/objects" --parallel "$(nproc)"
    } >"$scratch/log" 2>&1 || {
        tail -n 40 "$scratch/log"
        exit 1
    }
done
# shellcheck disable=SC2086
set -- $folders
for file in libsimgp.so.1.0.0 libsimgp.a; do
    cmp "$1/objects/$file" "$2/objects/$file" || fault "Two builds of one moment differ: $file"
done
"$readelf" -S "$1/objects/libsimgp.so.1.0.0" | grep -q '\.debug_info' || fault "There was no debug information to compare."
[ $broken -ne 0 ] || rm -rf "$place"
finish

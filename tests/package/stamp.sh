# A build with SOURCE_DATE_EPOCH has that moment in its stamp, days of one digit with a space, and is the
# same when it is done again.
. "$(dirname "$0")/gate.sh" "$1"

command -v ninja >/dev/null || skip "ninja is missing."
export SOURCE_DATE_EPOCH=1291387660 CCACHE_DISABLE=1 # 2010-12-03 14:47:40 UTC
object=CMakeFiles/simgp_objects.dir/scmn/version.cpp.o
for build in first second; do
    "$cmake" -G Ninja -S "$source_dir" -B "$scratch/$build" ${toolchain:+-DCMAKE_TOOLCHAIN_FILE="$toolchain"} \
        -DCMAKE_C_COMPILER="$cc" -DCMAKE_CXX_COMPILER="$cxx" -DSIMGP_BUILD_TESTS=OFF -DSIMGP_BUILD_TOOLS=OFF \
        -DSIMGP_BUILD_BENCH=OFF >"$scratch/log" 2>&1 &&
        "$cmake" --build "$scratch/$build" --target "$object" >>"$scratch/log" 2>&1 || {
        cat "$scratch/log"
        exit 1
    }
    sleep 1
done
grep -qa 'Dec  3 2010 14:47:40' "$scratch/first/$object" || fault "The stamp is not that of SOURCE_DATE_EPOCH."
cmp "$scratch/first/$object" "$scratch/second/$object" || fault "Two builds of one moment differ."
finish

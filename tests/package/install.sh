# Installs to a temporary prefix and builds a C program against the CMake package, shared and static, and
# through pkg-config; each must convert a pixel.
. "$(dirname "$0")/gate.sh" "$1"

prefix=$scratch/prefix
"$cmake" --install "$build_dir" --prefix "$prefix" >"$scratch/log" 2>&1 || {
    cat "$scratch/log"
    exit 1
}
user=$source_dir/tests/package/user

# Another place than the one it was configured for, with nothing pointing back to the sources.
backward=$(grep -rIlF -e "$source_dir" -e "$build_dir" "$prefix")
[ -z "$backward" ] || fault "Installed files name the source or build folder:" "$backward"

"$cmake" -G "$generator" -S "$user" -B "$scratch/user" -DCMAKE_PREFIX_PATH="$prefix" -DCMAKE_FIND_ROOT_PATH="$prefix" \
    ${toolchain:+-DCMAKE_TOOLCHAIN_FILE="$toolchain"} -DCMAKE_C_COMPILER="$cc" >"$scratch/log" 2>&1 &&
    "$cmake" --build "$scratch/user" >>"$scratch/log" 2>&1 || {
    cat "$scratch/log"
    exit 1
}
for program in user_shared user_static; do
    # shellcheck disable=SC2086
    $emulator "$scratch/user/$program" || fault "$program, built with find_package, failed."
done

if command -v pkg-config >/dev/null; then
    PKG_CONFIG_PATH=$(dirname "$(find "$prefix" -name simgp.pc)")
    export PKG_CONFIG_PATH PKG_CONFIG_LIBDIR=$PKG_CONFIG_PATH
    libdir=$(pkg-config --variable=libdir simgp)
    # shellcheck disable=SC2046,SC2086
    "$cc" $c_flags -std=c11 "$user/user.c" -o "$scratch/user_pkg" $(pkg-config --cflags --libs simgp) \
        -Wl,-rpath,"$libdir" && $emulator "$scratch/user_pkg" ||
        fault "The program built with pkg-config failed."
else
    fault "pkg-config is missing."
fi
finish

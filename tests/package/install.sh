# Installs to a temporary prefix and builds a C program against the CMake package, shared and static, and
# through pkg-config; each must convert a pixel. The tools run from there.
. "$(dirname "$0")/gate.sh" "$1"

install_to() { # FOLDER [ARG ...]
    "$cmake" --install "$build_dir" --prefix "$scratch/$1" "${@:2}" >"$scratch/log" 2>&1 || {
        cat "$scratch/log"
        exit 1
    }
}
install_to first
# The whole tree can be moved.
prefix=$scratch/prefix
mv "$scratch/first" "$prefix"
user=$source_dir/tests/package/user

# Another place than the one it was configured for, with nothing pointing back to the sources.
backward=$(grep -rIlF -e "$source_dir" -e "$build_dir" "$prefix")
[ -z "$backward" ] || fault "Installed files name the source or build folder:" "$backward"

# Each component has what its name says, and together they are everything.
files() { (cd "$scratch/$1" && find . ! -type d | sort); }
mkdir "$scratch/player" # which is empty where there is none
for component in runtime dev tools player; do install_to $component --component $component; done
expected='libsimgp\.so\.[0-9.]*$' suffix=
if [ "$library_kind" = PE ]; then
    expected='bin/libsimgp-1\.dll$' suffix=.exe
    export WINEPATH=Z:$prefix/bin # where programs find the DLL
fi
[ -n "$(files runtime)" ] && ! files runtime | grep -vqE "/$expected" || fault "Component runtime has:" "$(files runtime)"
! files dev | grep -qE "/bin/|/$expected" || fault "Component dev has:" "$(files dev)"
of_programs() {
    local program
    for program in "$@"; do
        printf './%s\n' "bin/$program" "share/man/man1/$program.1" "share/bash-completion/completions/$program"
    done
}
# shellcheck disable=SC2086
expected=$(of_programs $tools && [ -z "$tools" ] || echo ./share/simgp/python/simgp.py)
[ "$(files tools)" = "$(sort <<<"$expected")" ] || fault "Component tools has:" "$(files tools)"
[ "$(files player)" = "$(of_programs $player | sort)" ] || fault "Component player has:" "$(files player)"
rest=$(comm -3 <(files prefix) <({ files runtime && files dev && files tools && files player; } | sort))
[ -z "$rest" ] || fault "In no component, or in two:" "$rest"

for tool in $tools; do
    $emulator "$prefix/bin/$tool" --help >/dev/null || fault "$tool does not run where it is installed."
    ldd "$prefix/bin/$tool" | grep -q "libsimgp.* => $prefix/" ||
        fault "$tool takes the library from elsewhere:" "$(ldd "$prefix/bin/$tool" | grep libsimgp)"
done
# It has the library in it.
if [ -n "$player" ]; then
    "$prefix/bin/$player" --version >/dev/null || fault "$player does not run where it is installed."
    ! ldd "$prefix/bin/$player" | grep libsimgp || fault "$player takes the library from elsewhere."
fi

# The Python interface finds the library of its tree.
if [ -n "$tools" ] && [ -z "$toolchain" ] && /usr/bin/python3 -c 'import numpy' 2>/dev/null; then
    loaded=$(env -u SIMGP_LIBRARY PYTHONDONTWRITEBYTECODE=1 PYTHONPATH="$prefix/share/simgp/python" /usr/bin/python3 \
        -c 'import simgp, os; print(simgp.version()[0], os.path.realpath(simgp.library._name))')
    [[ $loaded == "1 $(realpath "$prefix")"/* ]] || fault "Python takes the library from elsewhere:" "$loaded"
fi

configure_user() { # FOLDER [ARG ...]
    "$cmake" -G "$generator" -S "$user" -B "$scratch/$1" -DCMAKE_PREFIX_PATH="$prefix" -DCMAKE_FIND_ROOT_PATH="$prefix" \
        ${toolchain:+-DCMAKE_TOOLCHAIN_FILE="$toolchain"} -DCMAKE_C_COMPILER="$cc" "${@:2}" >"$scratch/log" 2>&1
}
configure_user user && "$cmake" --build "$scratch/user" >>"$scratch/log" 2>&1 || {
    cat "$scratch/log"
    exit 1
}
for program in user_shared user_static road; do
    # shellcheck disable=SC2086
    $emulator "$scratch/user/$program$suffix" >/dev/null || fault "$program, built with find_package, failed."
done
configure_user refused -DCOMPONENTS=nonsense && fault "The package has a component 'nonsense'."

if command -v pkg-config >/dev/null; then
    PKG_CONFIG_PATH=$(dirname "$(find "$prefix" -name simgp.pc)")
    export PKG_CONFIG_PATH PKG_CONFIG_LIBDIR=$PKG_CONFIG_PATH
    [ "$library_kind" = PE ] && rpath= || rpath=-Wl,-rpath,
    libdir=$(pkg-config --variable=libdir simgp)
    # shellcheck disable=SC2046,SC2086
    "$cc" $c_flags -std=c11 "$user/user.c" -o "$scratch/user_pkg$suffix" $(pkg-config --cflags --libs simgp) \
        ${rpath:+"$rpath$libdir"} && $emulator "$scratch/user_pkg$suffix" ||
        fault "The program built with pkg-config failed."
else
    fault "pkg-config is missing."
fi
finish

# The packages for Debian: what is in them, how they depend on each other, and that programs are built and run
# with nothing but them. With root and debootstrap, in a clean system, which takes minutes and the network;
# elsewhere unpacked into a folder.
. "$(dirname "$0")/gate.sh" "$1"

for program in dpkg-deb dpkg-shlibdeps pkg-config ninja; do
    command -v $program >/dev/null || skip "$program is missing."
done
launcher=$(sed -n 's/^CMAKE_CXX_COMPILER_LAUNCHER:[A-Z]*=//p' "$build_dir/CMakeCache.txt")
# The folder stays, and with it what has not changed.
made=$build_dir/package.deb
(cd "$source_dir" && "$cmake" --preset packages -B "$made" -DCMAKE_C_COMPILER="$cc" -DCMAKE_CXX_COMPILER="$cxx" \
    -DCMAKE_CXX_COMPILER_LAUNCHER="$launcher" && "$cmake" --build "$made" --parallel 2 && cd "$made" &&
    rm -f ./*.deb && "$(dirname "$cmake")/cpack") >"$scratch/log" 2>&1 || {
    tail -n 40 "$scratch/log"
    exit 1
}

version=$(sed -n 's/^CMAKE_PROJECT_VERSION:[A-Z]*=//p' "$made/CMakeCache.txt")-1
architecture=$(dpkg --print-architecture) triplet=$(gcc -print-multiarch)
packages="libsimgp1 libsimgp-dev simgp-tools $player"
files=()
for package in $packages; do files+=("$made/${package}_${version}_$architecture.deb"); done
there=$(cd "$made" && printf '%s\n' *.deb | sort)
[ "$there" = "$(printf '%s\n' "${files[@]##*/}" | sort)" ] || {
    fault "These packages were made:" "$there"
    finish
}

field() { dpkg-deb -f "$made/$1_${version}_$architecture.deb" "$2"; }
has() { # PACKAGE PATTERN: a file whose path from the root on matches
    dpkg-deb -c "$made/$1_${version}_$architecture.deb" | awk '{ print $6 }' | grep -qxE "\./$2" || fault "$1 lacks $2."
}
for package in $packages; do
    [ "$(field $package Maintainer | sed 's/ <.*//')" = "the simgp authors" ] || fault "$package has another maintainer."
    # What is indented further is set as it stands.
    ! field "$package" Description | grep -nE '^  |^$' || fault "The lines of the description of $package are askew."
    has $package "usr/share/doc/$package/copyright"
    has $package "usr/share/doc/$package/changelog\.gz"
    others=$(dpkg-deb -c "$made/${package}_${version}_$architecture.deb" | awk '$2 != "root/root" || $1 ~ /^.....w|^........w/' |
        grep -v '^l')
    [ -z "$others" ] || fault "$package has files that others own or may write to:" "$others"
done
has libsimgp1 "usr/lib/$triplet/libsimgp\.so\.1"
has libsimgp-dev "usr/lib/$triplet/libsimgp\.so"
has libsimgp-dev "usr/lib/$triplet/pkgconfig/simgp\.pc"
has libsimgp-dev "usr/include/simgp/simgp\.h"
has simgp-tools "usr/bin/simgp-convert"
has simgp-tools "usr/share/man/man1/simgp-convert\.1\.gz"
if [ -n "$player" ]; then
    has simgp-play "usr/bin/simgp-play"
    has simgp-play "usr/share/man/man1/simgp-play\.1\.gz"
    has simgp-play "usr/share/bash-completion/completions/simgp-play"
    for library in libsdl2-2.0-0 libavformat libavcodec libpng16-16; do
        [[ $(field simgp-play Depends) == *$library* ]] || fault "simgp-play does not ask for $library."
    done
    [[ $(field simgp-play Depends) != *libsimgp* ]] || fault "simgp-play asks for the library that is in it."
fi
[[ $(field libsimgp1 Depends) =~ ^libc6\ \([^,]*$ ]] || fault "libsimgp1 depends on:" "$(field libsimgp1 Depends)"
for package in libsimgp-dev simgp-tools; do
    [[ $(field $package Depends) == *"libsimgp1 (= $version)"* ]] || fault "$package does not ask for its libsimgp1."
done
[[ $(field simgp-tools Depends) == *libpng16-16* ]] || fault "simgp-tools does not ask for libpng."
dpkg-deb -I "${files[0]}" shlibs | grep -qx "libsimgp 1 libsimgp1 (>= .*)" || fault "libsimgp1 has no shlibs."

if command -v lintian >/dev/null; then
    # There is no address to write to.
    said=$(lintian --allow-root --fail-on none --tag-display-limit 0 "${files[@]}" 2>&1 | grep '^E:' |
        grep -v 'bogus-mail-host')
    [ -z "$said" ] || fault "lintian finds:" "$said"
fi

# A program in $root, whose folder /trial has sources and packages, does all the rest; with an argument, it
# tries the player.
cat >"$scratch/try.sh" <<'END'
set -e
cd /trial
cc -std=c11 road.c -o road_pkg-config $(pkg-config --cflags --libs simgp)
./road_pkg-config
cmake -S . -B build >/dev/null
cmake --build build >/dev/null
./build/road
./build/road_static
simgp-convert -q testcard:64x48@2 -o card.y4m
simgp-convert -q card.y4m -o frame-%d.png
test -s frame-1.png
simgp-probe --fourcc avc1 >/dev/null
if [ $# -gt 0 ]; then
    # FFmpeg reads the film; nobody sees the window.
    simgp-play --version
    SDL_VIDEODRIVER=dummy simgp-play card.y4m --frames 2 --rgb32 --screenshot seen.png
    simgp-convert -q seen.png -o seen.rgb888
    simgp-convert -q frame-1.png -o meant.rgb888
    cmp seen.rgb888 meant.rgb888
fi
END
cat >"$scratch/CMakeLists.txt" <<'END'
cmake_minimum_required(VERSION 3.22)
project(road LANGUAGES C)
find_package(simgp 1.0 REQUIRED)
add_executable(road road.c)
target_link_libraries(road PRIVATE simgp::simgp)
add_executable(road_static road.c)
target_link_libraries(road_static PRIVATE simgp::simgp_static)
END
put_trial_into() { # FOLDER
    mkdir -p "$1"
    cp "$scratch/try.sh" "$scratch/CMakeLists.txt" "$source_dir/examples/road.c" "${files[@]}" "$1"
}

# The clean system is made once and kept as it was.
clean=$build_dir/clean-system.tar
if [ "$(id -u)" = 0 ] && command -v debootstrap >/dev/null; then
    suite=$(. /etc/os-release && echo "${VERSION_CODENAME:-stable}")
    if [ ! -f "$clean" ]; then
        timeout 600 debootstrap --variant=minbase --include=gcc,libc6-dev,pkgconf,cmake,make "$suite" "$scratch/root" \
            >"$scratch/log" 2>&1 && tar -C "$scratch/root" -cf "$clean.part" . && mv "$clean.part" "$clean"
    else
        mkdir "$scratch/root" && tar -C "$scratch/root" -xf "$clean"
    fi
fi
if [ -f "$clean" ]; then
    echo "In a clean system:"
    put_trial_into "$scratch/root/trial"
    # What they depend on comes from the distribution.
    timeout 900 chroot "$scratch/root" sh -c 'apt-get update && apt-get install -y --no-install-recommends /trial/*.deb' \
        >"$scratch/log" 2>&1 || {
        tail -n 20 "$scratch/log"
        fault "The packages cannot be installed."
        finish
    }
    chroot "$scratch/root" sh /trial/try.sh $player || fault "What is installed does not work."
    chroot "$scratch/root" apt-get purge -y $packages >"$scratch/log" 2>&1 || fault "The packages cannot be removed."
    left=$(cd "$scratch/root" && find usr etc var/lib/dpkg/info -path '*simgp*')
    [ -z "$left" ] || fault "Left behind when they are removed:" "$left"
else
    echo "Unpacked into a folder; there is no clean system here:"
    for file in "${files[@]}"; do dpkg-deb -x "$file" "$scratch/root"; done
    put_trial_into "$scratch/trial"
    sed -i "s#^cd /trial#cd '$scratch/trial'#" "$scratch/trial/try.sh"
    PATH=$scratch/root/usr/bin:$PATH LD_LIBRARY_PATH=$scratch/root/usr/lib/$triplet \
        PKG_CONFIG_PATH=$scratch/root/usr/lib/$triplet/pkgconfig CMAKE_PREFIX_PATH=$scratch/root/usr \
        sh "$scratch/trial/try.sh" $player || fault "What is unpacked does not work."
fi
finish

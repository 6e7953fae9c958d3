#!/bin/bash
# Builds the reference of the public headers, with the guides, from Doxygen (1.9 or newer), and holds it against
# what has to be in it. Usage, from the root: make.sh FOLDER HEADER ...; pages are then in FOLDER/html.
set -u
folder=$1
shift
rm -rf "$folder"
mkdir -p "$folder"
{
    cat docs/reference/Doxyfile
    printf '%s = %s\n' OUTPUT_DIRECTORY "\"$folder\"" STRIP_FROM_PATH "\"$PWD\"" WARN_LOGFILE "\"$folder/warnings\"" \
        INPUT "$* README.md $(echo docs/guides/*.md)" USE_MDFILE_AS_MAINPAGE "\"$PWD/README.md\"" \
        INPUT_FILTER '"python3 docs/reference/filter.py"' PROJECT_NUMBER "$(sed -n 's/^  *VERSION \([0-9.]*\).*/\1/p' CMakeLists.txt | head -n 1)"
} >"$folder/Doxyfile"
if ! doxygen "$folder/Doxyfile" >"$folder/log" 2>&1 || [ -s "$folder/log" ]; then
    tail -n 20 "$folder/log"
    exit 1
fi
status=0
if [ -s "$folder/warnings" ]; then
    status=1
    sed "s|^$PWD/||" "$folder/warnings"
fi
python3 docs/reference/check.py "$folder/xml" cmake/exports.txt || status=1
exit $status

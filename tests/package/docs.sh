# The reference of the public headers can be made, and says everything (docs/reference/check.py). ./run docs calls
# this with the folder that the pages are to stay in.
. "$(dirname "$0")/gate.sh" "$1"

command -v doxygen >/dev/null || skip "doxygen is missing."
cd "$source_dir" || exit 1
# shellcheck disable=SC2086
bash docs/reference/make.sh "${2:-$scratch/docs}" $public_headers $public_cxx_headers >"$scratch/log" 2>&1 ||
    fault "The reference of the public headers has gaps:" "$(head -n 40 "$scratch/log")"
finish

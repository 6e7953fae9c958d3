# All sources are laid out as .clang-format says; ./run format does it.
. "$(dirname "$0")/gate.sh" "$1"

command -v clang-format-14 >/dev/null || skip "clang-format-14 is missing."
cd "$source_dir" || exit 1
find simd simgp scmn tests tools bench examples fuzz \( -name '*.h' -o -name '*.hpp' -o -name '*.cpp' -o -name '*.c' \) -print0 \
    2>/dev/null | xargs -0 clang-format-14 --dry-run -Werror 2>"$scratch/log" ||
    fault "Not formatted:" "$(grep -oE '^[^:]+:[0-9]+' "$scratch/log" | head -n 20)"
finish

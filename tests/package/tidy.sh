# clang-tidy finds nothing in the library and the tools (.clang-tidy). rows/unit.cpp, which is compiled once for each
# area and instruction set, takes minutes and is left out.
. "$(dirname "$0")/gate.sh" "$1"

command -v clang-tidy >/dev/null || skip "clang-tidy is missing."
[ -f "$build_dir/compile_commands.json" ] || skip "This build has no compile_commands.json."
cd "$source_dir" || exit 1
files=$(grep -oE '"file": "[^"]*"' "$build_dir/compile_commands.json" | cut -d '"' -f 4 | sort -u |
    grep -E "^$source_dir/(simgp|scmn|rows|tools)/[^/]*\.cpp$" | grep -v '/rows/unit\.cpp$' | grep -E "${2:-.}")
[ -n "${2:-}" ] || [ "$(wc -l <<<"$files")" -gt 20 ] || fault "Only these sources were found:" "$files"
xargs -P 2 -n 4 clang-tidy --quiet -p "$build_dir" <<<"$files" >"$scratch/log" 2>/dev/null ||
    fault "clang-tidy says:" "$(grep -E 'error:|warning:' "$scratch/log" | sort -u | head -n 40)"
finish

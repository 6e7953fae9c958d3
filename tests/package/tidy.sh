# clang-tidy finds nothing in the library, its vector rows for every instruction set, and the tools (.clang-tidy). Of
# sources and units whose names match a second argument alone, if there is one.
. "$(dirname "$0")/gate.sh" "$1"

command -v clang-tidy >/dev/null || skip "clang-tidy is missing."
commands=$build_dir/compile_commands.json unit_file=$source_dir/rows/unit.cpp
[ -f "$commands" ] || skip "This build has no compile_commands.json."
cd "$source_dir" || exit 1
files=$(grep -oE '"file": "[^"]*"' "$commands" | cut -d '"' -f 4 | sort -u |
    grep -E "^$source_dir/(simgp|scmn|rows|tools)/[^/]*\.cpp$" | grep -vxF "$unit_file" | grep -E "${2:-.}")
databases=
# rows/unit.cpp has a command for each instruction set and area; each gets a folder with a database of its own.
while read -r command; do
    unit=$(grep -oE 'simgp_[a-z0-9]+_(simgp|scmn)_[a-z0-9_]+\.dir/' <<<"$command" | head -n 1)
    mkdir "$scratch/$unit" && databases+=$scratch/${unit%/}$'\n'
    printf '[{"directory": "%s",\n%s\n"file": "%s"}]\n' "$build_dir" "$command" "$unit_file" \
        >"$scratch/$unit/compile_commands.json"
done < <(grep -E '"command": .*/simgp_[a-z0-9]+_(simgp|scmn)_[a-z0-9_]+\.dir/(__/)?rows/unit\.cpp\.o' "$commands" | grep -E "${2:-.}")
[ -n "${2:-}" ] || { [ "$(wc -l <<<"$files")" -gt 20 ] && [ "$(wc -l <<<"$databases")" -gt 40 ]; } ||
    fault "Only these sources were found:" "$files"$'\n'"$databases"
{
    [ -z "$files" ] || sed "s#^#$build_dir #" <<<"$files"
    [ -z "$databases" ] || sed "s#\$# $unit_file#" <<<"${databases%$'\n'}"
} | xargs -P 2 -n 2 clang-tidy --quiet -p >"$scratch/log" 2>/dev/null ||
    fault "clang-tidy says:" "$(grep -E 'error:|warning:' "$scratch/log" | sort -u | head -n 40)"
finish

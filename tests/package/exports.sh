# The exported names: the list, the dynamic symbol table and the headers agree, and the static library
# brings no other C names.
. "$(dirname "$0")/gate.sh" "$1"

grep '^[a-z]' "$source_dir/cmake/exports.txt" >"$scratch/listed"
sort -u "$scratch/listed" >"$scratch/list"
repeated=$(sort "$scratch/listed" | uniq -d)
[ -z "$repeated" ] || fault "Twice in exports.txt:" "$repeated"

if [ "$library_kind" = PE ]; then
    "$objdump" -p "$shared_library" | sed -n '/^\[Ordinal\/Name Pointer\] Table/,/^$/p' |
        awk '$1 == "[" || /^\t*\[/ { print $NF }' | grep -v Table
else # Type A is the name of the version itself.
    "$nm" -D --defined-only "$shared_library" | awk '$2 != "A" { sub(/@.*/, "", $3); print $3 }'
fi | sort -u >"$scratch/dynamic"

leaves='visibility *\("default"\)'
[ "$library_kind" = PE ] && leaves=dllimport
# The declared names: after the preprocessor, SIMGP_API is an attribute; the name is the last word before
# the parameters of a function, the brackets of a table or the end.
for header in $public_headers; do
    "$cc" -E -P -x c -std=c11 -I"$source_dir" "$source_dir/$header"
done | tr '\n' ' ' | sed 's/[;{}]/\n/g' | sed -nE "s/.*__attribute__ *\(\($leaves\)\)//p" |
    sed -E 's/[[(=].*//; s/ *$//; s/.*[ *]//' |
    sort -u >"$scratch/declared"
[ -s "$scratch/declared" ] || fault "No declaration found in the public headers."

compare() { # FILE FILE TEXT: lines of the first that the second lacks
    local lines
    lines=$(comm -23 "$1" "$2")
    [ -z "$lines" ] || fault "$3" "$lines"
}
compare "$scratch/list" "$scratch/dynamic" "In exports.txt, not exported by the shared library:"
compare "$scratch/dynamic" "$scratch/list" "Exported by the shared library, not in exports.txt:"
compare "$scratch/list" "$scratch/declared" "In exports.txt, not declared in a public header:"
compare "$scratch/declared" "$scratch/list" "Declared in a public header, not in exports.txt:"

# GCC for Windows keeps pointers to tables of other objects under names of their own.
# Names in the static library meet those of the program: C names must be public, C++ names ours.
"$nm" -g --defined-only "$static_library" | awk 'NF == 3 { print $3 }' |
    grep -vE '^_Z(GV|TV)?NK?5simgp|^__x86\.get_pc_thunk|^\.refptr\.' | sort -u >"$scratch/static"
compare "$scratch/list" "$scratch/static" "In exports.txt, not in the static library:"
compare "$scratch/static" "$scratch/list" "Global in the static library, neither public nor in namespace simgp:"

# Each umbrella header includes all public headers of its family, and every header that exports is public.
for family in simgp scmn; do
    umbrella=$source_dir/$family/$family.h
    [ -f "$umbrella" ] || continue
    for header in $public_headers; do
        case $header in
            "$family/$family.h" | */export.h) continue ;;
            "$family"/*) grep -q "#include \"$header\"" "$umbrella" ||
                fault "$family/$family.h does not include $header." ;;
        esac
    done
done
unknown=$(cd "$source_dir" && grep -l '^SIMGP_API' simgp/*.h scmn/*.h 2>/dev/null |
    grep -vxF "$(printf '%s\n' $public_headers)")
[ -z "$unknown" ] || fault "Exports functions, but is not in SIMGP_PUBLIC_HEADERS:" "$unknown"
finish

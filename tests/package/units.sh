# No code that is compiled with newer instructions may be taken for baseline code: whatever a unit of
# vector rows shows to the linker lies in the namespace of its target. Where i686 code asks for its own address,
# the compiler adds thunks of two old instructions, the same everywhere.
. "$(dirname "$0")/gate.sh" "$1"

thunks='__x86\.get_pc_thunk\.[a-z]+$'
checked=0
while read -r target unit_objects; do
    [ -n "$target" ] || continue
    for object in $unit_objects; do
        leaks=$("$nm" --defined-only "$object" | awk '$2 ~ /[A-Zuvw]/ { print $2, $3 }' |
            grep -vE "^. (_Z(GV)?NK?5simgp${#target}$target|$thunks)")
        [ -z "$leaks" ] || fault "${object#"$build_dir"/} defines, outside simgp::$target:" "$leaks"
        # Groups of sections are merged by name across the whole program.
        groups=$("$readelf" -gW "$object" | sed -n 's/.*group section.*\[\([^]]*\)\] contains.*/\1/p' |
            grep -vE "^_ZN?K?5simgp${#target}$target|^_ZZ?NK?5simgp${#target}$target|^$thunks")
        [ -z "$groups" ] || fault "${object#"$build_dir"/} shares, outside simgp::$target:" "$groups"
        checked=$((checked + 1))
    done
done <<<"$units"
[ $checked -gt 0 ] || skip "This build has no vector rows."
finish

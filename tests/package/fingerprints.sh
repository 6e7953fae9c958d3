# simgp-check calls every exported function, and the table has a line for each.
. "$(dirname "$0")/gate.sh" "$1"

grep '^[a-z]' "$source_dir/cmake/exports.txt" | sort >"$scratch/exports"
compare() { # FILE TEXT: the same names as in exports.txt
    local lines
    lines=$(comm -3 "$scratch/exports" "$1")
    [ -z "$lines" ] || fault "$2, which differ from exports.txt:" "$lines"
}
# shellcheck disable=SC2086
$emulator "$check" --list | sort >"$scratch/listed"
compare "$scratch/listed" "Functions that simgp-check lists"
# What it takes from the library, it was written to call.
"$nm" -D --undefined-only "$check" | awk '{ print $2 }' | grep -E '^(simgp|scmn|tbl)_' >"$scratch/taken"
# The address of a table is in the program itself, where the linker lays a copy of it.
"$nm" -D --defined-only "$check" | awk '$2 ~ /[BDRV]/ { print $3 }' | grep -E '^(simgp_tbl|tbl)_' >>"$scratch/taken"
sed 's/@.*//' "$scratch/taken" | sort -u >"$scratch/called"
compare "$scratch/called" "Names that simgp-check takes from the library"
table=$source_dir/docs/fingerprints.txt
grep '^[a-z]' "$table" | grep -v '^all ' | cut -d ' ' -f 1 | sort >"$scratch/known"
compare "$scratch/known" "Lines of docs/fingerprints.txt"
finish

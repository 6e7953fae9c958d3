# simgp-check calls every exported function, the table has a line for each, and a wrong line is found.
. "$(dirname "$0")/gate.sh" "$1"

grep '^[a-z]' "$source_dir/cmake/exports.txt" | sort >"$scratch/exports"
compare() { # FILE TEXT: the same names as in exports.txt
    local lines
    lines=$(comm -3 "$scratch/exports" "$1")
    [ -z "$lines" ] || fault "$2, which differ from exports.txt:" "$lines"
}
export WINEPATH=Z:$build_dir # where Windows programs find the DLL
# shellcheck disable=SC2086
$emulator "$check" --list | tr -d '\r' | sort >"$scratch/listed"
compare "$scratch/listed" "Functions that simgp-check lists"
if [ "$library_kind" = ELF ]; then
    # What it takes from the library, it was written to call.
    "$nm" -D --undefined-only "$check" | awk '{ print $2 }' | grep -E '^(simgp|scmn|tbl)_' >"$scratch/taken"
    # The address of a table is in the program itself, where the linker lays a copy of it.
    "$nm" -D --defined-only "$check" | awk '$2 ~ /[BDRV]/ { print $3 }' | grep -E '^(simgp_tbl|tbl)_' >>"$scratch/taken"
    sed 's/@.*//' "$scratch/taken" | sort -u >"$scratch/called"
    compare "$scratch/called" "Names that simgp-check takes from the library"
fi
table=$source_dir/docs/fingerprints.txt
grep '^[a-z]' "$table" | grep -v '^all ' | cut -d ' ' -f 1 | sort >"$scratch/known"
compare "$scratch/known" "Lines of docs/fingerprints.txt"

# The comparison finds one function that differs, and says which, and one that is missing.
sed 's/^scmn_ceil_log2 .*/scmn_ceil_log2 12345678/; /^scmn_floor_log2/d' "$table" >"$scratch/altered"
# shellcheck disable=SC2086
said=$($emulator "$check" "--compare=$scratch/altered" --function scmn_ceil_log2 --function scmn_floor_log2 \
    --function scmn_bsr_clz_in_code)
status=$?
[ $status -eq 1 ] && grep -q '^scmn_ceil_log2 .*should be 12345678' <<<"$said" && grep -q '^scmn_floor_log2 ' <<<"$said" &&
    ! grep -q '^scmn_bsr_clz_in_code' <<<"$said" || fault "With an altered table, status $status and:" "$said"
finish

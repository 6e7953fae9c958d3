# The stack of every kernel stays below 16 KiB: the largest frame of a kernel and the largest frame of a
# vector row together, and none of unknown size.
. "$(dirname "$0")/gate.sh" "$1"

limit=16384
# Lines "BYTES KIND FUNCTION" of the given objects; the compiler left them beside each object.
frames() {
    local object
    for object in "$@"; do
        local usage=${object%.*}.su
        [ -f "$usage" ] || usage=${object}.su
        [ -f "$usage" ] || { echo "0 missing ${object#"$build_dir"/}"; continue; }
        awk -F '\t' '{ print $2, $3, $1 }' "$usage"
    done | sort -rn
}
# shellcheck disable=SC2086
frames $objects >"$scratch/kernels"
# shellcheck disable=SC2046
frames $(cut -d ' ' -f 2- <<<"$units") >"$scratch/rows"

missing=$(grep -h ' missing ' "$scratch/kernels" "$scratch/rows")
[ -z "$missing" ] || skip "The compiler reports no stack usage."
unbounded=$(grep -hE '^[0-9]+ dynamic( |$)' "$scratch/kernels" "$scratch/rows")
[ -z "$unbounded" ] || fault "Frames of unknown size:" "$unbounded"

kernel=$(head -n 1 "$scratch/kernels")
row=$(head -n 1 "$scratch/rows")
total=$((${kernel%% *} + $(cut -d ' ' -f 1 <<<"${row:-0}")))
printf 'Largest frames, in bytes:\n    kernel %s\n    row    %s\n' "$kernel" "$row"
[ $total -lt $limit ] || fault "Together $total bytes, $limit or more."
finish

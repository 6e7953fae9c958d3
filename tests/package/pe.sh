# The DLL as Windows sees it.
. "$(dirname "$0")/gate.sh" "$1"

headers=$("$objdump" -p "$shared_library")
[ "$(basename "$shared_library")" = libsimgp-1.dll ] || fault "The DLL's name is $(basename "$shared_library")."
needed=$(sed -n 's/.*DLL Name: *//p' <<<"$headers" | grep -viE '^(kernel32|msvcrt|ucrtbase|api-ms-win-crt-[a-z0-9-]*)\.dll$')
[ -z "$needed" ] || fault "Needs more than the C library and the system's own:" "$needed"
for flag in DYNAMIC_BASE NX_COMPAT HIGH_ENTROPY_VA; do
    grep -q "^[[:space:]]*$flag" <<<"$headers" || fault "The DLL's characteristics lack $flag."
done

# What the objects ask of others. Calls of the system go through pointers that the linker fills.
# shellcheck disable=SC2046,SC2086
all_objects="$objects $(cut -d ' ' -f 2- <<<"$units" | xargs)"
for object in $all_objects; do "$nm" --defined-only "$object"; done | awk 'NF == 3 { print $3 }' | sort -u >"$scratch/defined"
for object in $all_objects; do "$nm" -u "$object"; done | awk '{ print $NF }' | sort -u >"$scratch/asked"
allowed='memcpy|memmove|memset|memcmp|abort|malloc|free|___chkstk_ms|__imp_SwitchToThread'
imports=$(comm -23 "$scratch/asked" "$scratch/defined" | grep -vxE "$allowed")
[ -z "$imports" ] || fault "Asks for what the list in pe.sh does not have:" "$imports"

# The stack is aligned to 16 bytes, and compilers may think otherwise of what they put there: no move of a wider
# register counts on it. Stores that bypass the caches have no other form.
"$objdump" -d --no-show-raw-insn "$shared_library" >"$scratch/code"
grep -qE '%[yz]mm' "$scratch/code" || [ -z "$units" ] || fault "No code for wide registers was found."
aligned=$(grep -E 'vmov(dqa|aps|apd)[0-9]*\s' "$scratch/code" | grep -E '%[yz]mm' | grep -F '(' | head -n 5)
[ -z "$aligned" ] || fault "Moves that count on aligned memory:" "$aligned"

# Whoever unwinds the stack finds every function that has a frame.
"$objdump" -h "$shared_library" | grep -q '\.pdata' || fault "There is no table of functions (.pdata)."
finish

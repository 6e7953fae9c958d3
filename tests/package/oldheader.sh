# A program that was built against the header of the release runs on the library as it is now: it links, every
# name is there, no constant has another value, and the descriptors still have their form.
. "$(dirname "$0")/gate.sh" "$1"

stored=$source_dir/cmake/abi
header=$stored/simgp-1.0.h
libdir=$(dirname "$shared_library")
suffix=
[ "$library_kind" = ELF ] || { suffix=.exe && cp "$shared_library" "$scratch"; } # found beside the program
build() { # PROGRAM SOURCE [ARG ...]: in C, against the stored header and nothing else of this library
    # shellcheck disable=SC2086
    "$cc" $c_flags -std=c11 -Wall -Wextra -Werror -I"$stored" -o "$scratch/$1$suffix" "$2" "${@:3}"
}
run() { $emulator "$scratch/$1$suffix"; }

# shellcheck disable=SC2086
build user "$(dirname "$0")/old_user.c" "$shared_library" -Wl,-rpath,"$libdir" || fault "old_user.c does not build."
run user || fault "The program built against the stored header failed."

# Every name, by its address.
names=$(grep '^SIMGP_API' "$header" | sed -E 's/[[(=;].*//; s/ *$//; s/.*[ *]//' | sort -u)
[ "$(wc -l <<<"$names")" -ge 170 ] || fault "Few names in the stored header:" "$names"
{
    printf '#include "simgp-1.0.h"\n#include <stdint.h>\nint main(void) {\nuintptr_t volatile p;\n'
    printf 'p = (uintptr_t)&%s; if (!p) return 1;\n' $names
    printf 'return 0;\n}\n'
} >"$scratch/names.c"
build names "$scratch/names.c" "$shared_library" -Wl,-rpath,"$libdir" && run names ||
    fault "A name of the stored header is not in the library."

# Constants, by their values.
constants=$(grep -oE '\b(SIMGP|SCMN)_[A-Z0-9_]+ = ' "$header" | sed 's/ = //' | sort -u)
[ "$(wc -l <<<"$constants")" -ge 60 ] || fault "Few constants in the stored header:" "$constants"
print_constants() { # INCLUDE ...
    printf '#include <stdio.h>\n'
    printf '#include "%s"\n' "$@"
    printf 'int main(void) {\n'
    # shellcheck disable=SC2086
    for name in $constants; do printf 'printf("%s %%d\\n", (int)%s);\n' "$name" "$name"; done
    printf 'return 0;\n}\n'
}
print_constants simgp-1.0.h >"$scratch/old.c"
print_constants simgp/simgp.h scmn/scmn.h >"$scratch/new.c"
# shellcheck disable=SC2086
build old "$scratch/old.c" && "$cc" $c_flags -std=c11 -I"$source_dir" -o "$scratch/new$suffix" "$scratch/new.c" || {
    fault "A constant of the stored header is gone."
    finish
}
run old >"$scratch/old.txt"
run new >"$scratch/new.txt"
changed=$(diff "$scratch/old.txt" "$scratch/new.txt") && [ -s "$scratch/old.txt" ] ||
    fault "Constants that have other values than in the stored header:" "$changed"
finish

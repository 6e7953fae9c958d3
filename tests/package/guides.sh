# The code that the README and the guides show can be taken as it stands. What a piece needs is said by a comment
# right before it, which no reader of the page sees:
#
#     <!-- from: examples/road.c -->      it stands there, to the letter, and is compiled and run with the rest
#     <!-- given: extern int parts; -->   declarations that it counts on, in one line or several
#     <!-- prints: text -->               what it prints, of Python
#     <!-- not compiled: reason -->
#
# Without one it compiles as it is: statements in a function, and with all headers if it includes none. Python runs,
# beside a white frame.nv12 of 640 x 480.
. "$(dirname "$0")/gate.sh" "$1"

cd "$source_dir" || exit 1
# The pieces, as $scratch/piece.N.code, with their place, their language and what the comment says in piece.N.about.
awk -v to="$scratch/piece" '
    FNR == 1 { inside = commented = 0; note = "" }
    !inside && sub(/^<!-- /, "") { commented = 1; note = "" }
    commented { commented = !sub(/ *-->$/, ""); note = note $0 "\n"; next }
    inside && /^ *```$/ { inside = 0; note = ""; close(code); next }
    inside { print >code; next }
    /^ *(```|~~~)/ {
        inside = 1; n++; code = to "." n ".code"; about = to "." n ".about"; place = FILENAME ":" FNR
        gsub(/[ `~]/, ""); printf "%s\n%s\n%s", place, $0, note >about; close(about); printf "" >code; next
    }
    NF { note = "" }' README.md docs/guides/*.md
pieces=$(find "$scratch" -name 'piece.*.code' | wc -l)
[ "$pieces" -ge 9 ] || fault "Only $pieces pieces of code were found."

# What a piece makes is used by what the reader has behind it.
left='-Wno-unused-but-set-variable -Wno-unused-parameter'

head -c $((640 * 480)) /dev/zero | tr '\0' '\353' >"$scratch/frame.nv12"
head -c $((640 * 240)) /dev/zero | tr '\0' '\200' >>"$scratch/frame.nv12"

# whole: writes the piece as a file that compiles, from $code and $note.
whole() {
    local head
    printf '#include <stddef.h>\n#include <stdint.h>\n#include <stdio.h>\n'
    if ! grep '^#include' "$code"; then
        printf '#include <%s>\n' simgp/simgp.h simgp/describe.h scmn/scmn.h
        [ "$language" = c ] || printf '#include <simgp/simgp.hpp>\n'
    fi
    case $note in given:*) printf '%s\n' "${note#given:}" ;; esac
    head=$(grep -m 1 -vE '^(#include.*|/?[ *]\*.*|/\*.*)?$' "$code")
    if [[ $head =~ ^[A-Za-z].*\(.*(,|\ \{)$ && ! $head =~ ^(if|for|while|switch)\  ]]; then
        cat "$code"
    else
        printf 'int shown(void);\nint shown(void) {\n'
        grep -v '^#include' "$code"
        printf 'return 0;\n}\n'
    fi
}

for about in "$scratch"/piece.*.about; do
    code=${about%about}code
    { read -r place; read -r language; } <"$about"
    note=$(tail -n +3 "$about")
    case $note in
        from:*)
            example=$(xargs <<<"${note#from:}")
            { [[ $example == examples/* ]] && [[ "$(<"$example")" == *"$(<"$code")"* ]]; } ||
                fault "$place is not in $example as it is shown."
            continue
            ;;
        "not compiled: "?*) continue ;;
    esac
    case $language in
        c) compiler="$cc $c_flags -std=c11 -xc" ;;
        cpp) compiler="$cxx $cxx_flags -std=c++20 -xc++" ;;
        python)
            /usr/bin/python3 -c 'import numpy' 2>/dev/null || continue
            said=$(cd "$scratch" && SIMGP_LIBRARY=$shared_library PYTHONDONTWRITEBYTECODE=1 \
                PYTHONPATH=$source_dir/python /usr/bin/python3 "$code" 2>&1) || fault "$place fails:" "$said"
            [[ $note != prints:* ]] || [ "$said" = "${note#prints: }" ] || fault "$place prints:" "$said"
            continue
            ;;
        *)
            fault "$place is '$language', which nothing compiles; \"not compiled:\" can say why."
            continue
            ;;
    esac
    whole >"$scratch/whole"
    # shellcheck disable=SC2086
    said=$($compiler -O1 -Wall -Wextra -Werror -pedantic $left -I"$source_dir" -c "$scratch/whole" -o /dev/null 2>&1) ||
        fault "$place does not compile:" "$said"
done
finish

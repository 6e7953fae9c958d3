# The C code that the README and the guide to threads show is that of the examples, which are compiled and
# run; the README's C++ compiles, and its Python runs.
. "$(dirname "$0")/gate.sh" "$1"

cd "$source_dir" || exit 1
# pieces LANGUAGE: writes each piece of that language to block.LANGUAGE.1, .2, ...; prints their number.
pieces() {
    awk -v to="$scratch/block.$1" -v fence="\`\`\`$1" '$0 == fence { n++; inside = 1; next }
        /^```$/ { inside = 0 }
        inside { print >(to "." n) }
        END { print n + 0 }' README.md docs/guides/threads.md
}
blocks=$(pieces c)
[ "$blocks" -ge 3 ] || fault "The README shows $blocks pieces of C, which are too few to be found properly."
for block in "$scratch"/block.c.*; do
    code=$(<"$block") found=no
    for example in examples/*.c; do
        [[ "$(<"$example")" == *"$code"* ]] && found=yes
    done
    [ $found = yes ] || fault "In no example as the README shows it:" "$code"
done

[ "$(pieces cpp)" = 1 ] || fault "The README shows no C++, or more than this gate compiles."
{
    printf '#include <cstdio>\n#include "simgp/simgp.hpp"\nvoid shown(std::span<const uint8_t> bytes) {\n'
    cat "$scratch/block.cpp.1"
    printf '}\n'
} >"$scratch/shown.cpp"
# shellcheck disable=SC2086
"$cxx" $cxx_flags -std=c++20 -Wall -Wextra -Werror -fsyntax-only -I"$source_dir" "$scratch/shown.cpp" ||
    fault "The README's C++ does not compile."

[ "$(pieces python)" = 1 ] || fault "The README shows no Python, or more than this gate runs."
if /usr/bin/python3 -c 'import numpy' 2>/dev/null; then
    head -c $((640 * 480)) /dev/zero | tr '\0' '\353' >"$scratch/frame.nv12" # white
    head -c $((640 * 240)) /dev/zero | tr '\0' '\200' >>"$scratch/frame.nv12"
    said=$(cd "$scratch" && SIMGP_LIBRARY=$shared_library PYTHONDONTWRITEBYTECODE=1 PYTHONPATH=$source_dir/python \
        /usr/bin/python3 block.python.1)
    [ "$said" = "[255. 255. 255.]" ] || fault "Of a white frame, the README's Python says:" "$said"
fi
finish

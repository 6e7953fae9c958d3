# The C code that the README shows is that of the examples, which are compiled and run; so is that of the
# guide to threads.
. "$(dirname "$0")/gate.sh" "$1"

cd "$source_dir" || exit 1
blocks=$(awk -v to="$scratch/block" '/^```c$/ { n++; inside = 1; next }
    /^```$/ { inside = 0 }
    inside { print >(to "." n) }
    END { print n + 0 }' README.md docs/guides/threads.md)
[ "$blocks" -ge 3 ] || fault "The README and the guide show $blocks pieces of C, which are too few to be found properly."
for block in "$scratch"/block.*; do
    code=$(<"$block") found=no
    for example in examples/*.c; do
        [[ "$(<"$example")" == *"$code"* ]] && found=yes
    done
    [ $found = yes ] || fault "In no example as the README shows it:" "$code"
done
finish

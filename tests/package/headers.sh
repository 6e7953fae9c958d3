# Each public header compiles alone, as C11, C++17 and C++20, without a warning; those of C++, as C++20, with
# and without exceptions.
. "$(dirname "$0")/gate.sh" "$1"

strict="-pedantic -Wall -Wextra -Wundef -Werror -fsyntax-only -I$source_dir"
for header in $public_headers; do
    printf '#include "%s"\n#include "%s"\nint main(void) { return 0; }\n' "$header" "$header" >"$scratch/use.c"
    cp "$scratch/use.c" "$scratch/use.cpp"
    # shellcheck disable=SC2086
    {
        "$cc" $c_flags -std=c11 -Wstrict-prototypes $strict "$scratch/use.c" || fault "$header is no C11."
        for standard in c++17 c++20; do
            "$cxx" $cxx_flags -std=$standard $strict "$scratch/use.cpp" || fault "$header is no $standard."
        done
    }
done
for header in $public_cxx_headers; do
    printf '#include "%s"\n#include "%s"\nint main() { return 0; }\n' "$header" "$header" >"$scratch/use.cpp"
    for more in "" "-fno-exceptions -fno-rtti -Wshadow -Wconversion"; do
        # shellcheck disable=SC2086
        "$cxx" $cxx_flags -std=c++20 $strict $more "$scratch/use.cpp" || fault "$header is no C++20 with '$more'."
    done
done
finish

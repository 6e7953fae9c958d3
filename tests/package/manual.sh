# The manual pages and completions that are installed with the tools have every option, and the words that it takes.
. "$(dirname "$0")/gate.sh" "$1"

[ -n "$tools" ] || skip "This build has no tools."
"$cmake" --install "$build_dir" --prefix "$scratch/prefix" >"$scratch/log" 2>&1 || {
    cat "$scratch/log"
    exit 1
}
# answers TOOL WORD ...: what Bash offers for the last word.
answers() {
    PATH=$scratch/prefix/bin:$PATH bash -c '. "$1"; shift
        COMP_WORDS=("$@") COMP_CWORD=$(($# - 1)); _simgp "$1" 2>/dev/null; printf "%s\n" "${COMPREPLY[@]}"' bash \
        "$scratch/prefix/share/bash-completion/completions/$1" "$@"
}
for tool in $tools $player; do
    page=$scratch/prefix/share/man/man1/$tool.1
    options=$("$scratch/prefix/bin/$tool" --help | grep -E '^  -' | grep -oE '^  [^ {]+' | grep -oE -- '--?[a-z0-9-]+')
    [ "$(wc -w <<<"$options")" -gt 3 ] || fault "$tool --help shows no options."
    heads=$(sed -nE 's/\\fI.*//; s/\\-/-/g; s/^\\fB(-.*)\\fR.*/\1/p' "$page" | tr -d , | tr ' ' '\n')
    missing=$(comm -3 <(sort <<<"$options") <(sort <<<"$heads"))
    [ -z "$missing" ] || fault "In $tool --help alone, or in its page alone:" "$missing"
    missing=$(grep -B 1 -E '^(\\&)?\.?( Not together.*)?$' "$page")
    [ -z "$missing" ] || fault "Without an explanation in $tool.1:" "$missing"
    for part in NAME SYNOPSIS OPTIONS DESCRIPTION EXAMPLES; do
        grep -qx "\.SH $part" "$page" || fault "$tool.1 has no part $part."
    done
    if command -v mandoc >/dev/null; then
        said=$(mandoc -Tlint -Wwarning "$page" | grep -v 'missing date')
        [ -z "$said" ] || fault "mandoc says of $tool.1:" "$said"
    fi
    missing=$(comm -23 <(grep -e -- <<<"$options" | sort) <(answers "$tool" -- | sort))
    [ -z "$missing" ] || fault "Not completed for $tool:" "$missing"
done
case " $tools " in *" simgp-convert "*)
    [ "$(answers simgp-convert --rotate 90 | xargs)" = "90l 90r" ] || fault "The turns are not completed."
    [ "$(answers simgp-convert --color bt709 | xargs)" = "bt709 bt709-full" ] || fault "The colours are not completed."
    [ "$(answers simgp-convert -t rgb | xargs)" = "rgb565 rgb888 rgba8888" ] || fault "The formats are not completed."
    [ "$(answers simgp-convert --format = nv | xargs)" = "nv12 nv21" ] || fault "--format=nv is not completed."
    touch "$scratch/some picture.png"
    [ "$(answers simgp-convert "$scratch/some")" = "$scratch/some picture.png" ] || fault "Files are not completed."
    [ -z "$(cd "$scratch" && answers simgp-convert --frames '')" ] || fault "Files are completed for a number."
    ;;
esac
finish

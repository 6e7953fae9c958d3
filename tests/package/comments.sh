# The comments of the public headers are laid out: lists, tables and drawings as their author set them, not
# run together by a formatter. The layout that is looked for:
#
# - Lines have 100 columns at most.
# - Running text stands at the margin, one space behind the star, with single spaces between words.
# - An item of a list begins with "- ", and its other lines stand under its first word. A blank line ends
#   a list.
# - Tables and drawings are indented, and a blank line ends them. A column, that is what follows two or
#   more spaces, stands under or over another one of the same table; each line begins in a column.
# - Code is indented by four or more, and may look as it likes.
. "$(dirname "$0")/gate.sh" "$1"

cat >"$scratch/layout.awk" <<'AWK'
function fault(at, text) { printf "%s:%d: %s\n", FILENAME, at, text }

# The columns of a text: where it begins, and where a word follows two or more spaces. Returns their number.
function find_columns(text, columns,    n, at, rest) {
    match(text, /[^ ]/)
    columns[n = 1] = at = RSTART
    rest = substr(text, at)
    while (match(rest, /[^ ]  +[^ ]/)) {
        columns[++n] = at += RSTART + RLENGTH - 2
        rest = substr(text, at)
    }
    return n
}

# An indented block has ended: columns that no other line has, lines that begin in none.
function end_block(    i, k, n, columns, uses, at) {
    split("", uses)
    split("", at)
    if (size > 1 && indent[1] < 4) {
        for (i = 1; i <= size; i++) {
            n = find_columns(text_of[i], columns)
            for (k = 1; k <= n; k++) uses[columns[k]]++
            for (k = i == 1 ? 1 : 2; k <= n; k++) at[columns[k]] = 1
        }
        for (i = 1; i <= size; i++) {
            n = find_columns(text_of[i], columns)
            if (!(columns[1] in at)) fault(line_of[i], "begins in no column of its table")
            for (k = 2; k <= n; k++)
                if (uses[columns[k]] < 2)
                    fault(line_of[i], "a column that no other line has: " substr(text_of[i], columns[k], 20))
            # An entry without text, where others have some: a name alone, not a part of a sentence.
            if (n == 1 && i > 1 && columns[1] == indent[1] + 1 && text_of[i] !~ /^ *[A-Z0-9_]+,?$/ && has_columns())
                fault(line_of[i], "continues a row of the table at its margin")
        }
    }
    size = 0
}
function has_columns(    i, columns) {
    for (i = 1; i <= size; i++)
        if (find_columns(text_of[i], columns) > 1) return 1
    return 0
}

function blank() {
    end_block()
    item = -1
}

# A line of a comment, without its star and the space behind it.
function look(text,    spaces) {
    sub(/ *\*\/.*/, "", text)
    sub(/ +$/, "", text)
    if (text == "") return blank()
    match(text, /[^ ]/)
    spaces = RSTART - 1
    if (substr(text, spaces + 1) ~ /[.;:,] - | - [A-Z][a-z]/) fault(FNR, "an item of a list in mid-line")
    if (text ~ /^ *- /) {
        end_block()
        item = spaces
        spaces += 2
    } else if (item >= 0) {
        if (spaces != item + 2) {
            fault(FNR, "continues an item of a list, but not under its first word")
            item = -1
        }
    } else if (spaces == 0) {
        if (size) fault(FNR, "continues a table or a drawing at the margin")
        end_block()
    } else {
        line_of[++size] = FNR
        text_of[size] = text
        indent[size] = spaces
        return
    }
    if (text !~ /^ *- / ? substr(text, spaces + 1) ~ /[^ ]  +[^ ]/ : text ~ /[^ -]  +[^ ]/)
        fault(FNR, "a gap in running text: a row of a table?")
}

FNR == 1 { inside = 0; blank() }
!inside && /^ *\/\*/ {
    comments++
    inside = 1
    text = $0
    sub(/^ *\/\*/, "", text)
    sub(/^ /, "", text)
    blank()
    if (length > 100) fault(FNR, "longer than 100 columns")
    look(text)
    if (/\*\//) { inside = 0; blank() }
    next
}
inside {
    text = $0
    if (length > 100) fault(FNR, "longer than 100 columns")
    if (text ~ /^ *\*\/ *$/) text = ""
    else if (text !~ /^ +\*( |$)/) fault(FNR, "a line of a comment without a star")
    sub(/^ +\* ?/, "", text)
    look(text)
    if (/\*\//) { inside = 0; blank() }
}
END { if (comments < 50) print "Only " comments + 0 " comments found: they are not looked for properly." }
AWK

cd "$source_dir" || exit 1
# shellcheck disable=SC2086
awk -f "$scratch/layout.awk" $public_headers >"$scratch/log" || fault "The comments could not be read."
[ ! -s "$scratch/log" ] || fault "Comments of public headers that have lost their layout:" "$(cat "$scratch/log")"
finish

#!/bin/sh
# Makes a manual page from what a program says of itself, so that no option is missing or out of date:
#   page.sh PAGE NAME VERSION PROGRAM [ARG ...]     PROGRAM is run with --help
set -e
page=$1 name=$2 version=$3
shift 3
help=$("$@" --help)
printf '%s\n' "$help" | LC_ALL=C awk -v name="$name" -v version="$version" '
function text(s) { # nothing in it is an instruction to the formatter
    gsub(/\\/, "\\e", s)
    gsub(/-/, "\\-", s)
    return s ~ /^[.\x27]/ ? "\\&" s : s
}
# Ends the entry of an option or argument: how it is written, and what it does.
function close_entry(    names, value, more, list) {
    if (head == "") return
    more = ""
    if (match(head, / Excludes:.*/)) {
        more = substr(head, RSTART + 11)
        head = substr(head, 1, RSTART - 1)
        gsub(/ /, ", ", more)
        sub(/^, /, "", more)
        more = " Not together with " more "."
    }
    if (match(head, /\{[^}]*,[^}]*\}/)) { # the words that are allowed
        list = substr(head, RSTART + 1, RLENGTH - 2)
        gsub(/,/, ", ", list)
        more = " One of " list "." more
    }
    sub(/\{.*/, "", head)
    sub(/:.*/, "", head)
    sub(/ REQUIRED$/, "", head)
    names = head
    value = ""
    if (match(head, / +[A-Z]+( \.\.\.)?$/)) {
        names = substr(head, 1, RSTART - 1)
        value = tolower(substr(head, RSTART + 1))
        sub(/^ +/, "", value)
    }
    gsub(/,/, ", ", names)
    print ".TP"
    print "\\fB" text(names) "\\fR" (value == "" || is_argument ? "" : " \\fI" value "\\fR")
    sub(/^ +/, "", body)
    print text(body (body ~ /[.]$/ ? "" : ".") more)
    head = body = ""
}
function section(title) { print ".SH " title }
NR == 1 {
    sub(/\.$/, "")
    what = $0
    printf ".\\\" Made by page.sh from the text of \"%s --help\".\n", name
    printf ".TH %s 1 \"\" \"simgp %s\" \"User commands\"\n", toupper(text(name)), version
    section("NAME")
    print text(name) " \\- " tolower(substr(text(what), 1, 1)) substr(text(what), 2)
    next
}
/^Usage: / {
    section("SYNOPSIS")
    sub(/^Usage: [^ ]+ ?/, "")
    print ".B " text(name)
    print text($0)
    next
}
/^(Positionals|Options):$/ {
    close_entry()
    is_argument = /^P/
    section(is_argument ? "ARGUMENTS" : "OPTIONS")
    state = "entries"
    next
}
state == "entries" && /^  [^ ]/ {
    close_entry()
    head = substr($0, 3)
    if (match(head, /  +/)) {
        body = substr(head, RSTART + RLENGTH)
        head = substr(head, 1, RSTART - 1)
    } else if (length(head) > 27 && match(head, /\} [a-z]/)) { # one space is left between them
        body = substr(head, RSTART + 2)
        head = substr(head, 1, RSTART)
    } else if (match(head, /^[^ ]+ +[A-Z]+(:\{[^}]*\})?  ?[a-z]/)) {
        body = substr(head, RSTART + RLENGTH - 1)
        head = substr(head, 1, RSTART + RLENGTH - 2)
        sub(/ +$/, "", head)
    }
    next
}
state == "entries" && /^ +[^ ]/ {
    sub(/^ +/, "")
    body = body (body == "" ? "" : " ") $0
    next
}
state == "entries" && /^$/ { next }
/^Keys:$/ {
    close_entry()
    section("KEYS")
    state = "keys"
    next
}
state == "keys" && $0 != "" { # several to a line: the key, what it does
    sub(/^ +/, "")
    n = split($0, column, /  +/)
    for (i = 1; i < n; i += 2) print ".TP\n\\fB" text(column[i]) "\\fR\n" text(column[i + 1]) "."
    next
}
state == "keys" {
    state = "entries"
    next
}
/^Examples:$/ {
    close_entry()
    section("EXAMPLES")
    print ".nf"
    state = "examples"
    next
}
state == "examples" {
    sub(/^  /, "")
    if ($0 != "") print text($0)
    next
}
state == "entries" { # the first line behind them
    close_entry()
    section("DESCRIPTION")
    state = "prose"
}
state == "prose" && $0 == "" { # between paragraphs, not behind the last one
    paragraph = 1
    next
}
state == "prose" && paragraph { print ".PP" }
state == "prose" { paragraph = 0; print text($0) }
END {
    close_entry()
    if (state == "examples") print ".fi"
    section("EXIT STATUS")
    print "0 if all went well; anything else if not, and the standard error says why."
    section("SEE ALSO")
    print "The headers of the library are its manual: \\fIsimgp/simgp.h\\fR and \\fIscmn/scmn.h\\fR."
}' >"$page"

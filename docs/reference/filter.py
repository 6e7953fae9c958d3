#!/usr/bin/env python3
"""Doxygen's input filter: gives it the public headers with their comments in its own markup.

The comments are laid out for people who read the header (tests/package/comments.sh keeps them so). What is
made of them, line by line, so that what Doxygen says of a line is right:

- A comment right before declarations documents them, up to the next blank line.
- A comment that a blank line follows belongs to the file; if it begins with a heading, it opens a section.
- Indented lists whose names are parameters become @param; "Returns ..." at the start of a paragraph, @return.
- Every other indented block is shown as it stands.
- A kernel that is declared by a type alone has the type's comment.

Of Markdown pages, links to files that are no pages lose the link. Usage: filter.py FILE
"""
import re
import sys

PAGES = re.compile(r"^(README\.md|(docs/)?guides/[\w-]+\.md|[\w-]+\.md)(#.*)?$")
HEADING = re.compile(r"^(\S.*?) -{5,}$")


def escape(text):
    """Running text: only `code` has a meaning to Doxygen."""
    parts = re.split(r"(`[^`]*`)", text)
    parts[::2] = [re.sub(r"([\\<>&#%@$*~|])", r"\\\1", part).replace("::", r"\::") for part in parts[::2]]
    return "".join(parts)


def rows_of(block):
    """The rows of a list "name, name   text" as [names, [texts]], or None if the block is none."""
    rows = []
    column = None
    for line in block:
        row = re.match(r"^( {2,3}((?:\w+)(?:, \w+)*) {2,})(\S.*)$", line)
        if row and column in (None, len(row[1])):
            column = len(row[1])
            rows.append([row[2].split(", "), [row[3]]])
        elif rows and line[:column].strip() == "" and len(line) > column:
            rows[-1][1].append(line.strip())
        else:
            return None
    return rows


def convert(lines, parameters, returns):
    """The lines of a comment without their stars, in Doxygen's markup; as many as there were."""
    out = []
    at = 0
    in_item = False
    paragraph = True
    while at < len(lines):
        line = lines[at]
        if not line.strip():
            in_item, paragraph = False, True
            out.append("")
        elif line.startswith(" ") and not in_item:
            end = at
            while end < len(lines) and lines[end].strip():
                end += 1
            block = lines[at:end]
            rows = rows_of(block)
            if rows and all(name in parameters or name == "returns" for names, _ in rows for name in names):
                for names, texts in rows:
                    head = "@return " if names == ["returns"] else f"@param {','.join(names)} "
                    out += [head + escape(texts[0])] + [escape(text) for text in texts[1:]]
            else:
                if out:
                    out[-1] += " @verbatim"
                else:
                    block[0] = "@verbatim " + block[0]
                out += block
                out[-1] += " @endverbatim"
            at = end
            paragraph = True
            continue
        else:
            in_item = in_item or line.startswith("- ")
            text = escape(line)
            if paragraph and returns and text.startswith("Returns"):
                text = "@return " + re.sub(r"^Returns,? ", "", text)
            paragraph = False
            out.append(text)
        at += 1
    return out


def plain_comments(lines):
    """C++ comments on lines of their own as C comments."""
    def is_comment(k):
        return 0 <= k < len(lines) and re.match(r"^ {0,4}//( |$)", lines[k])

    out = []
    for k, line in enumerate(lines):
        if is_comment(k):
            line = re.sub(r"//", " *" if is_comment(k - 1) else "/*", line, count=1)
            line += "" if is_comment(k + 1) else " */"
        out.append(line)
    return out


def statement(lines, at):
    """The declaration that begins at a line, in one line."""
    text = ""
    for line in lines[at:at + 12]:
        text += " " + line.strip()
        if re.search(r"[;{]\s*(/\*.*)?$", line) or line.startswith("#"):
            break
    return re.sub(r"\s+", " ", text).strip()


def name_of(text):
    """The name that a declaration declares, or None."""
    for pattern in (r"^#define (\w+)", r"\(\*(\w+)\)\(", r"^typedef struct \w+ (\w+);", r"(\w+)\(", r"(\w+)(?:\[\d*\])?;"):
        found = re.search(pattern, text)
        if found:
            return found[1]
    return None


def filter_header(lines):
    if any(line.startswith("namespace") for line in lines):
        lines = plain_comments(lines)
    out = list(lines)
    depth = []  # what the open braces hold: "record", "scope" or "body"
    pending = ""  # what has been begun since the last declaration ended
    in_section = False
    first = True
    shared = ""  # what the last comment says, while no blank line has come
    commented = False  # whether the line is right behind a comment
    at = 0
    while at < len(lines):
        line = lines[at]
        begin = line.find("/*")
        if begin >= 0 and "body" not in depth:
            end = at
            while "*/" not in lines[end]:
                end += 1
            trailing = line[:begin].strip() != ""
            texts = [line[begin + 2:]] + [re.sub(r"^\s*\* ?", "", text) for text in lines[at + 1:end + 1]]
            if texts[0].startswith(" "):
                texts[0] = texts[0][1:]
            texts = [re.sub(r"\s*\*/\s*$", "", text).rstrip() for text in texts]
            if lines[end].strip() == "*/":
                texts[-1] = ""
            head, tail = line[:begin], " */"
            if trailing:
                if depth[-1:] == ["record"]:
                    texts = [escape(text.strip()) for text in texts]
                    head += "/**<"
                else:
                    head += "/*"
            else:
                following = lines[end + 1] if end + 1 < len(lines) else ""
                text = statement(lines, end + 1)
                if text.startswith(("#if", "#define")) and not first:
                    # It is of all macros up to the next blank line, in whatever branch.
                    names = []
                    for macro in lines[end + 1:]:
                        found = re.match(r"#define (\w+)", macro)
                        if not macro or "/*" in macro:
                            break
                        if found and found[1] not in names:
                            names.append(found[1])
                    if names:
                        texts[0] = f"@@def {names[0]}\\ilinebr " + texts[0]
                    else:
                        following = ""
                    tail += "".join(f" /** @def {name}\\ilinebr @copydoc {names[0]} */" for name in names[1:])
                heading = HEADING.match(texts[0])
                prefix = "/**"
                if heading:
                    if in_section:
                        head += "/**@}*/ "
                    in_section = True
                    texts[0] = ""
                    if following.strip():
                        prefix = f"/** @name {heading[1]}\\ilinebr */ /**@{{*/ /**"
                    else:
                        prefix = f"/** @name {heading[1]}"
                        tail += " /**@{*/"
                elif first:
                    prefix = "/** @file\\ilinebr"
                elif not following.strip() and not depth:
                    prefix = "/** @file\\ilinebr"
                elif not following.strip():
                    prefix = "/*"
                parameters = re.findall(r"(\w+)(?:\[\d*\])?\s*(?=[,)]|=[^,)]*[,)])", text) if following.strip() else []
                nothing = re.search(r"\bvoid \w+\(|^class|^struct|^enum|^#|_fn \w+;", text)
                mark = texts[0].startswith("@@def")
                texts = convert(texts, parameters, following.strip() and not nothing)
                if mark:
                    texts[0] = texts[0].replace(r"\@\@", "@", 1).replace(r"\\ilinebr", r"\ilinebr", 1)
                head += prefix
                if prefix != "/*":
                    commented = bool(following.strip())
                    shared = " ".join(texts) if commented else ""
                    if "@verbatim" in shared:
                        shared = f"@copydoc {name_of(text)}"
            out[at] = head + " " + texts[0]
            for k in range(1, len(texts)):
                out[at + k] = texts[k]
            out[end] += tail
            first = False
            if not trailing:
                at = end + 1
                continue
            line, at = line[:begin], end
        code = re.sub(r"//.*", "", line)
        if not code.strip():
            shared, commented = ("", False) if not line.strip() else (shared, commented)
        elif code.startswith("#") or "body" in depth:
            commented = commented and code.startswith("#if")
        elif depth[-1:] == ["record"] and depth[0] == "scope":  # the members of a class
            if not pending and not commented and shared and not re.match(r"\s*(}|public:|private:)", code):
                out[at] = f"/** {shared} */ " + out[at]
            out[at] = re.sub(r";  // (\S.*)", lambda found: ";  ///< " + escape(found[1]), out[at])
            commented = False
        elif not pending and re.match(r"SIMGP_(API|INLINE|CONSTEXPR)|typedef|inline|struct|using", code):
            text = statement(lines, at)
            family = re.match(r"^SIMGP_API (?:extern )?(\w+_fn) ", text)
            wrapper = re.match(r"^inline result (\w+)\(", text) if depth else None
            if commented:
                pass
            elif shared:
                out[at] = f"/** {shared} */ " + out[at]
            elif family:
                out[at] = f"/** @copydoc {family[1]} */ " + out[at]
            elif wrapper:
                out[at] = f"/** As simgp_{wrapper[1]}. */ " + out[at]
            commented = False
        else:
            commented = False
        if code.strip() == "SIMGP_END_DECLS" and in_section:
            out[at] = "/**@}*/ " + out[at]
            in_section = False
        if not code.startswith("#") and not re.match(r"SIMGP_(BEGIN|END)_DECLS|SIMGP_STATIC_ASSERT", code):
            for sign in re.findall(r"[{};]|[^{};]+", code):
                if sign == "{":
                    kind = "body"
                    if re.search(r"\b(namespace)\b", pending):
                        kind = "scope"
                    elif re.search(r"\b(enum|struct|class)\b", pending) and "(" not in pending:
                        kind = "record"
                    depth.append(kind)
                    pending = ""
                elif sign == "}":
                    if depth:
                        depth.pop()
                    pending = ""
                elif sign == ";":
                    pending = ""
                else:
                    pending += sign.strip() and sign
        at += 1
    return out


def filter_page(lines):
    def link(found):
        target = found[2]
        return found[0] if re.match(r"^(https?:|#)", target) or PAGES.match(target) else found[1]

    return [re.sub(r"!?\[([^\]]*)\]\(([^)\s]*)\)", link, line) for line in lines]


def main():
    with open(sys.argv[1], encoding="utf-8") as file:
        lines = file.read().split("\n")
    filtered = filter_page(lines) if sys.argv[1].endswith(".md") else filter_header(lines)
    sys.stdout.write("\n".join(filtered))


if __name__ == "__main__":
    main()

#!/usr/bin/env python3
"""Whether the reference says everything, by the XML that Doxygen makes beside the pages.

- Every public name has a text: functions, types and their members, codes, macros; and every name that the
  library exports is there.
- Every parameter is explained: in a list or by its name in the text of the function, of its section, of its file
  or of the family that the text or the type refers to; or it points to a record that has a text.
- Every function that returns something says what; those that take descriptors name their results.

Usage: check.py FOLDER-OF-XML FILE-OF-EXPORTED-NAMES
"""
import collections
import pathlib
import re
import sys
import xml.etree.ElementTree as xml

# Texts that name what is returned, without "Returns".
NAMES_A_RESULT = re.compile(
    r"^(The|How many|Where|What|Whether|Number of|Bytes|Samples|Visible|A sample|Bands begin|Floor|SIMGP_VERSION|"
    r"Date|Is a|For the inline functions alone)\b")
SAYS_A_RESULT = re.compile(r"\b(Returns?|returns?|Gives?|gives?|give|Refused (is|are))\b")

Member = collections.namedtuple("Member", "kind name where type parameters own around has_return file")


def text_of(element):
    return " ".join("".join(element.itertext()).split()) if element is not None else ""


def description(element):
    return " ".join(filter(None, (text_of(element.find(part)) for part in ("briefdescription", "detaileddescription"))))


def parameters_of(member):
    names = [(text_of(p.find("declname")), text_of(p.find("type"))) for p in member.findall("param")]
    if member.get("kind") == "typedef":
        names = []
        for part in text_of(member.find("argsstring")).lstrip(")").strip("()").split(","):
            found = re.match(r"(.*?)(\w+)(\[\d*\])?$", part.strip())
            if found and part.strip() != "void":
                names.append((found[2], found[1]))
    return [(name, kind) for name, kind in names if name]


def read(folder):
    members, records = [], {}
    for path in sorted(pathlib.Path(folder).glob("*.xml")):
        compound = xml.parse(path).getroot().find("compounddef")
        if compound is None or compound.get("kind") not in ("file", "struct", "class", "namespace"):
            continue
        name = text_of(compound.find("compoundname"))
        location = compound.find("location")
        file = location.get("file") if location is not None else ""
        if file.endswith(".md") or "checks" in name or name == "std":
            continue
        whole = description(compound)
        if compound.get("kind") in ("struct", "class"):
            records[name] = whole
        for section in compound.findall("sectiondef"):
            if section.get("kind", "").startswith("private"):
                continue
            around = text_of(section.find("description")) + " " + whole
            for member in section.findall("memberdef"):
                own_name = text_of(member.find("name"))
                if own_name.endswith("_") or member.get("prot") != "public":
                    continue
                at = member.find("location")
                where = f"{at.get('file')}:{at.get('line')}"
                if member.get("kind") == "enum":
                    for value in member.findall("enumvalue"):
                        members.append(Member("code", text_of(value.find("name")), where, "", [], description(value),
                                              "", False, file))
                    continue
                members.append(Member(member.get("kind"), own_name, where, text_of(member.find("type")),
                                      parameters_of(member), description(member), around,
                                      member.find(".//simplesect[@kind='return']") is not None, at.get("file")))
    return members, records


def main():
    members, records = read(sys.argv[1])
    by_name = {member.name: member for member in members}
    files = {member.file: member.around for member in members if member.kind in ("function", "typedef", "variable")}
    faults = []

    def fault(member, text):
        faults.append(f"{member.where}: {member.name}: {text}")

    for name, text in records.items():
        if not text:
            faults.append(f"{name}: the record has no text")
    with open(sys.argv[2], encoding="utf-8") as exports:
        names = [line.strip() for line in exports if line.strip() and not line.startswith("#")]
    faults += [f"{name}: is exported and not in the reference" for name in names if name not in by_name]

    parameters = results = 0
    for member in members:
        if not member.own:
            fault(member, "has no text")
            continue
        if member.kind not in ("function", "typedef"):
            continue
        texts = [member.own, member.around]
        families = re.findall(r"\bsimgp_\w+_fn\b|(?<=explained at )\w+|(?<=described at )\w+", member.own)
        if member.file.endswith(".hpp"):  # as its first comment says
            families += ["simgp_" + member.name] + re.findall(r"\bsimgp_\w+", member.own)
        texts += [text for name in families if name in by_name for text in (by_name[name].own, by_name[name].around)]
        for name, kind in member.parameters:
            parameters += 1
            record = re.search(r"\w+", re.sub(r"\b(const|struct)\b", "", kind))
            if record and (records.get(record[0]) or records.get("simgp::v1::" + record[0])):
                continue
            if record and record[0] in ("view", "const_view", "basic_view", "basic_plane"):
                continue
            if not any(re.search(rf"\b{name}\b", text) for text in texts):
                fault(member, f"does not explain its parameter {name}")
        kind = re.sub(r"\b(static|inline|constexpr|extern)\b", "", member.type).strip()
        if member.kind != "function" or kind in ("", "void") or member.file.endswith(".hpp"):
            continue
        results += 1
        says = member.has_return or SAYS_A_RESULT.search(member.own)
        takes_descriptor = any("simgp_img" in kind for _, kind in member.parameters)
        if not says and (takes_descriptor or not NAMES_A_RESULT.search(member.own)):
            fault(member, "does not say what it returns")
        elif takes_descriptor and not re.search(r"SIMGP_OK|\bRefused\b", member.own):
            fault(member, "does not name its results")

    if len(names) < 100 or parameters < 100 or results < 30:
        faults.append(f"Only {len(names)} exported names, {parameters} parameters, {results} results were looked at.")
    for line in sorted(faults):
        print(line)
    sys.exit(1 if faults else 0)


if __name__ == "__main__":
    main()

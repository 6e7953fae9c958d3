"""Instructions and cycles per pixel of the NEON rows beside libyuv's, without an ARM processor.

A probe program (arm_probe.cpp) calls a row twice, with two sizes, under qemu-user, which logs every
instruction that the row executes. What the longer call repeats is the inner loop, in the order of
execution, wherever the compiler has put its blocks; llvm-mca tells its cycles. The models of LLVM 19:

- Cortex-A53 and A55 retire in order, which makes latencies weigh more than they do there.
- Cortex-A9: loads and stores of structures cost next to nothing, and 128 bits as much as 64.
- Memory is always in the first cache. Of ARMv7's lists of three or four registers only the first counts
  as read or written.
"""
import argparse
import collections
import concurrent.futures
import datetime
import os
import re
import subprocess
import sys
import textwrap

FAMILIES = {
    "armv7": dict(title="ARMv7", emulator="qemu-arm", triple="thumbv7-linux-gnueabihf", attributes="+neon,+vfp3",
                  processors=["cortex-a9", "cortex-a57"]),
    "aarch64": dict(title="AArch64", emulator="qemu-aarch64", triple="aarch64-linux-gnu", attributes="+neon",
                    processors=["cortex-a53", "cortex-a55", "cortex-a72", "neoverse-n1"]),
}

# libyuv's rows that do the work of ours, with their multiples for each pixel. Its names of packings are
# those of a little-endian word: ARGB is bgra8888, RGB24 is bgr888, RAW is rgb888. Where it exchanges U and
# V to reach a packing, the row is the same.
PEERS = {
    **{f"half to {p}{two}": {row: 1}
       for p, row in [("rgb565", "I422ToRGB565Row"), ("bgr565", "I422ToRGB565Row"), ("rgb888", "I422ToRGB24Row"),
                      ("bgr888", "I422ToRGB24Row"), ("rgba8888", "I422ToARGBRow"), ("bgra8888", "I422ToARGBRow"),
                      ("argb8888", "I422ToRGBARow")]
       for two in ("", ", two")},
    **{f"{matrix}{pairs} to {p}, two": {row: 1}
       for matrix in ("", "coarse ") for pairs in ("uv", "vu")
       for p, row in [("rgb565", "NV12ToRGB565Row"), ("bgr565", "NV12ToRGB565Row"), ("rgb888", "NV21ToRGB24Row")]},
    "uyvy to bgra8888": {"UYVYToARGBRow": 1},
    "uyvy to rgba8888": {"UYVYToARGBRow": 1},
    "rgb888 to grey": {"RAWToYRow": 1},
    "bgr888 to grey": {"RGB24ToYRow": 1},
    "rgb565 to grey": {"RGB565ToYRow": 1},
    "rgb888 to yuv420": {"RAWToYRow": 1, "RAWToUVRow": .5},
    "bgr888 to yuv420": {"RGB24ToYRow": 1, "RGB24ToUVRow": .5},
    "rgb565 to yuv420": {"RGB565ToYRow": 1, "RGB565ToUVRow": .5},
    "rgba8888 to rgb565": {"ARGBToRGB565Row": 1},
    "pack": {"MergeUVRow": 1},
    "unpack": {"SplitUVRow": 1},
    "any half to words, two": {"I422ToRGB565Row": 1},
    "any half to three, two": {"I422ToRGB24Row": 1},
    "any half to four, two": {"I422ToARGBRow": 1},
    "any full to four": {"I444ToARGBRow": 1},
    "any pairs to words, two": {"NV12ToRGB565Row": 1},
    "any pairs to three, two": {"NV12ToRGB24Row": 1},
    "any pairs to four, two": {"NV12ToARGBRow": 1},
    "any groups to four": {"YUY2ToARGBRow": 1},
    "any three to grey": {"RAWToYRow": 1},
    "any four to grey": {"ARGBToYRow": 1},
    "any words to grey": {"RGB565ToYRow": 1},
    "any three to yuv420": {"RAWToYRow": 1, "RAWToUVRow": .5},
    "any four to yuv420": {"ARGBToYRow": 1, "ARGBToUVRow": .5},
    "any words to yuv420": {"RGB565ToYRow": 1, "RGB565ToUVRow": .5},
    "any three to means, two": {"RAWToYRow": 1, "RAWToUVRow": .5},
    "any four to means, two": {"ARGBToYRow": 1, "ARGBToUVRow": .5},
    "any words to means, two": {"RGB565ToYRow": 1, "RGB565ToUVRow": .5},
    "any split three": {"SplitRGBRow": 1},
    "any words to four": {"RGB565ToARGBRow": 1},
    "any three to three": {"RAWToRGB24Row": 1},
    "any three to four": {"RAWToARGBRow": 1},
    "any four to words": {"ARGBToRGB565Row": 1},
    "any four to three": {"ARGBToRAWRow": 1},
    "any split groups, two": {"YUY2ToYRow": 1, "YUY2ToUV422Row": 1},
    "any split groups to planes, two": {"YUY2ToYRow": 1, "YUY2ToUV422Row": .5},
    "any split groups, means, two": {"YUY2ToYRow": 1, "YUY2ToUVRow": .5},
    "any join groups": {"I422ToYUY2Row": 1},
    "any mean of lines": {"InterpolateRow": 1},
    "any mean of blocks": {"ScaleRowDown2Box": 1},
    "any every second": {"ScaleRowDown2": 1},
    "resize bytes, 2 to 3": {"InterpolateRow": 2 / 3, "ScaleFilterCols": 1},
    "resize bytes, 4 to 3": {"ScaleRowDown34_1_Box": 1},
    "resize bytes, 3 to 2": {"InterpolateRow": 3 / 2, "ScaleFilterCols": 1},
    "resize bytes, 2 to 1": {"ScaleRowDown2Box": 1},
    "transpose bytes": {"TransposeWx8": 1},
    "reverse bytes": {"MirrorRow": 1},
    "fill": {"ARGBSetRow": 1},
}
# What keeps rows above 0.8 of libyuv's cycles somewhere: rows by a regular expression.
BINDS = {
    "(uv|vu) to rgb888, two": "multiplications and shifts on Neoverse N1, one of each in a cycle. Ours are exact to the "
        "last bit with 7 fractional bits, libyuv's has 6.",
    "uyvy to .*8888": "the same. In these loops the samples of the next step are moved from register to register, half "
        "a move per pixel.",
    "(rgb|bgr)888 to grey|any (three|four) to grey": "six products of bytes for 16 pixels, on the one pipe that "
        "multiplies, and the loads of structures. libyuv's row has the same instructions, and so has GCC's of ours.",
    "rgba8888 to rgb565|any four to words": "loads of four registers on Cortex-A57, four cycles for 32 bytes. libyuv's "
        "row has the same. GCC moves the two halves of a word together.",
    "any (half|pairs|full|groups) to .*": "products and narrowing shifts, of which Cortex-A57 and Neoverse N1 do one in "
        "a cycle, and Cortex-A9 does one of anything. For 8 pixels that do not share chroma there are 19 instructions, "
        "and 18 in libyuv's rows, which have 6 fractional bits and weights rounded to them; where pixels share chroma "
        "ours are fewer, but compilers move vectors to where stores of structures want them.",
    "any (three|four) to (means, two|yuv420)": "rounded means of four, as bytes, cost two instructions more per channel "
        "than libyuv's sums of four, of which it drops no more than one bit; signs cost one more, as weights have "
        "either sign at run time.",
    "any (three|four) to (three|four)": "three moves between a load and a store of structures; libyuv exchanges two "
        "registers in place. The rest are additions to pointers, where GCC for 32-bit ARM splits a load in two.",
    "any split three": "on Neoverse N1 a store of one register by `str`, which compilers make, counts as two of those "
        "by `st1` that libyuv has. On Cortex-A57 the loads of structures, the same as libyuv's, take three cycles of "
        "four.",
    "any split groups.*": "on Cortex-A9, one instruction in a cycle: ours makes luma first and halves of chroma from "
        "it, where libyuv loads the line again as four registers. On Neoverse N1 stores by `str`, as above.",
    "any join groups": "moves between the registers of a load and those of a store: compilers do not load every second "
        "register. On Cortex-A72 the store takes four cycles of libyuv's five.",
    "any mean of lines|any mean of blocks": "loads, arithmetic and stores are the same instructions as libyuv's.",
    "any every second|pack|unpack|fill": "a load and a store of the same bytes as libyuv's. On Neoverse N1, `str` as "
        "above; GCC for 32-bit ARM moves what it loads to where the store of structures wants it.",
    "resize bytes, .*": "the plan's row picks samples by tables and has weights for each; libyuv's rows for these two "
        "ratios have both written out. Beside its rows for any ratio see 2 to 3 and 3 to 2.",
    "reverse bytes": "two instructions reverse a vector where `tbl` would be one. That would halve them on Neoverse N1 "
        "but takes three times as long on Cortex-A72.",
    "transpose bytes": "interleaving whole vectors takes 1.5 cycles on Cortex-A72, and three or six on A57; libyuv's "
        "transposing instructions for 8 x 8 blocks take half a cycle.",
}
# Of two lines, one gives luma alone.
SUMS = {f"{p} to yuv420": {f"{p} to half": .5, f"{p} to grey": .5}
        for p in ("rgb888", "bgr888", "rgb565", "any words", "any three", "any four")}


def inner_loop(short, long):
    """The addresses of a round of the loop that a larger size runs more often, and how many more rounds it ran.

    `short` and `long` are the addresses that two calls executed.
    """
    before, after = collections.Counter(short), collections.Counter(long)
    more = {at: n - before[at] for at, n in after.items() if n >= 8 and n > before[at]}
    if not more:
        raise ValueError("no loop")
    pivot = min(more, key=lambda at: (more[at], at))
    visits = [i for i, at in enumerate(long) if at == pivot]
    rounds = collections.Counter(tuple(long[i:j]) for i, j in zip(visits, visits[1:]))
    loop, times = rounds.most_common(1)[0]
    if times < .7 * (len(visits) - 1):
        raise ValueError(f"no steady state: {len(rounds)} different rounds")
    if abs(len(loop) * more[pivot] / (len(long) - len(short)) - 1) > .05:
        raise ValueError("the loop is not what grows with the size")
    return list(loop), more[pivot]


ACCESS = re.compile(r"v?(ld|st)[^c]|v?(push|pop)")
GENERAL = r"(x\d+|w\d+|r\d+|lr|sb|sl|fp|ip)\b"


class Stack:
    """Which general registers hold addresses on the stack, followed through what was executed."""

    def __init__(self):
        self.registers = {"sp"}

    def is_read_or_written(self, mnemonic, operands):
        if not ACCESS.match(mnemonic):
            return False
        base = re.search(r"\[(\w+)", operands) or re.match(r"(\w+)!?, *\{", operands)
        return base[1] in self.registers if base else True  # push and pop

    def follow(self, mnemonic, operands):
        to = re.match(GENERAL, operands)
        if not to or re.match("v?st|cmp|tst|cb|tb", mnemonic):
            return
        names = [name.strip() for name in operands.split(",")]
        if re.match("add|sub|mov", mnemonic) and len(names) > 1 and names[1] in self.registers:
            self.registers.add(to[1])
        elif not ("[" not in operands and ACCESS.match(mnemonic)):  # lists of registers keep their base
            self.registers.discard(to[1])


def is_move(mnemonic, operands):
    """From one vector register to another, nothing else."""
    names = [name.strip().split(".")[0] for name in operands.split(",")]
    if not all(re.fullmatch(r"[vqd]\d+", name) for name in names):
        return False
    kind = mnemonic.split(".")[0]
    return (kind in ("mov", "vmov", "fmov") and len(names) == 2) or \
        (kind in ("orr", "vorr") and len(names) == 3 and names[1] == names[2])


def counts(loop, stack):
    """Instructions, register moves, and loads and stores of vectors on the stack."""
    moves = spills = 0
    for mnemonic, operands in loop:
        moves += is_move(mnemonic, operands)
        vector = mnemonic.startswith("v") or re.search(r"\b[vqds]\d+\b", operands)
        spills += bool(vector) and stack.is_read_or_written(mnemonic, operands)
        stack.follow(mnemonic, operands)
    return dict(instructions=len(loop), moves=moves, spills=spills)


CONDITIONS = "eq|ne|cs|hs|cc|lo|mi|pl|vs|vc|hi|ls|ge|lt|gt|le"


def assembly(loop):
    """The loop as source text. What points into the code points at a name.

    The models know neither Thumb's conditional instructions, which are taken as done, nor vswp, for which
    vtrn stands, nor lists of more than two registers in vldm and vstm, which are split.
    """
    lines, conditional = [], 0
    for mnemonic, operands in loop:
        if re.fullmatch("it[te]*", mnemonic):
            conditional = len(mnemonic) - 1
            continue
        if conditional:
            conditional -= 1
            mnemonic = re.sub(rf"^([a-z]+?)({CONDITIONS})(\..*)?$", r"\1\3", mnemonic)
        if re.match("(b|cb|tb)", mnemonic) and not re.match("bic|bf|bif|bit|bsl", mnemonic):
            operands = re.sub(r"(#-?)?(0x[0-9a-f]+|(?<=#)-?\d+)\s*$", "there", re.sub(r"\s*<.*", "", operands))
        elif re.match("adrp?$|ldr", mnemonic):
            operands = re.sub("(?<=, )#?0x[0-9a-f]+ *<.*", "there", operands)
        many = re.fullmatch(r"(\w+)!?, *\{(d\d+(, d\d+)*)\}", operands)
        if mnemonic == "vswp":
            lines.append(f"vtrn.32 {operands}")
        elif mnemonic in ("vldmia", "vstmia") and many:
            registers = many[2].split(", ")
            lines += [f"{mnemonic[:3]}1.64 {{{', '.join(registers[i:i + 2])}}}, [{many[1]}]"
                      for i in range(0, len(registers), 2)]
        else:
            lines.append(f"{mnemonic} {operands}")
    return "\n".join(lines) + "\n"


def access_of(processor):
    """The name of the figure that `occupied` gives."""
    return f"{processor}: loads and stores"


def is_bound(ours, peer, processor):
    """Whether moving the bytes takes more than the goal, 0.8 of the peer's cycles, in the peer's way and in ours."""
    access = access_of(processor)
    return min(ours[access], peer[access]) > .8 * peer[processor]


def difference(figures):
    """Those of a loop, or what the second of two calls has more."""
    if len(figures) == 1:
        return figures[0]
    return {kind: figures[1][kind] - figures[0][kind] for kind in figures[1]}


def cycles(mca, family, processor, texts, rounds):
    """Of one more round of each loop."""
    totals = [simulated(mca, family, processor, texts, n, "Total Cycles") if n else [0] * len(texts) for n in rounds]
    return [(more - less) / (rounds[1] - rounds[0]) for less, more in zip(*totals)]


def occupied(mca, family, processor, texts):
    """The cycles that each loop's loads and stores alone keep the processor busy, however they are ordered."""
    accesses = ["".join(line for line in text.splitlines(True) if ACCESS.match(line)) or "nop\n" for text in texts]
    return simulated(mca, family, processor, accesses, 100, "Block RThroughput")


def simulated(mca, family, processor, texts, iterations, figure):
    """That figure of each loop. Instructions that have no model, such as returns, are left out."""
    regions = "".join(f"# LLVM-MCA-BEGIN\n{text}# LLVM-MCA-END\n" for text in texts)
    out = subprocess.run([mca, f"-mtriple={family['triple']}", f"-mattr={family['attributes']}",
                          f"-mcpu={processor}", f"-iterations={iterations}", "-all-views=false", "-summary-view",
                          "-skip-unsupported-instructions=lack-sched"],
                         input=regions, capture_output=True, text=True)
    found = [float(value) for value in re.findall(rf"{figure}: +([\d.]+)", out.stdout)]
    if len(found) != len(texts):
        sys.exit(f"llvm-mca, {processor}: {out.stderr}")
    return found


def disassemble(objdump, program, attributes):
    """{address: (mnemonic, operands)} of the rows and of what they call."""
    out = subprocess.run([objdump, "-d", "-j", ".text", "--no-show-raw-insn", f"--mattr={attributes}", program],
                         capture_output=True, text=True, check=True).stdout
    code, inside = {}, False
    for line in out.splitlines():
        label = re.match("[0-9a-f]+ <(.*)>:", line)
        if label:
            inside = re.search("4neon|_NEON|mem(cpy|move|set)", label[1])
        m = inside and re.match(r"\s*([0-9a-f]+):\s+([a-z][\w.]*)\s*(.*)", line)
        if m:
            code[int(m[1], 16)] = m[2], re.sub(r"\s*(//|@|;).*", "", m[3]).strip()
    return code


def ranges(addresses):
    """Those of addresses with no large gaps, as the emulator's log takes them."""
    spans = []
    for at in sorted(addresses):
        if spans and at - spans[-1][1] <= 64:
            spans[-1][1] = at
        else:
            spans.append([at, at])
    return ",".join(f"{first:#x}..{last:#x}" for first, last in spans)


class Probe:
    """A probe program: the library by one compiler, and libyuv."""

    def __init__(self, program, family, llvm):
        self.program, self.family, self.mca = program, family, f"{llvm}/llvm-mca"
        self.code = disassemble(f"{llvm}/llvm-objdump", program, family["attributes"])
        self.ranges = ranges(self.code)
        listing = subprocess.run([family["emulator"], program], capture_output=True, text=True, check=True).stdout
        self.rows = {}
        for number, line in enumerate(listing.splitlines()):
            name, address, pixels, *sizes = line.split("\t")
            self.rows[name] = number, int(address, 16) & ~1, int(pixels), [int(size) for size in sizes]

    def executed(self, number, address, size):
        """The addresses of what the row executed, and what it called."""
        log = subprocess.run([self.family["emulator"], "-singlestep", "-d", "exec,nochain", "-dfilter", self.ranges,
                              self.program, str(number), str(size)],
                             capture_output=True, text=True, check=True).stderr
        addresses = [int(at, 16) for at in re.findall(r"^Trace \d+: \S+ \[\w+/(\w+)/", log, re.M)]
        return addresses[addresses.index(address):]

    def loop(self, name):
        """What to measure of a row: pixels, and the instructions that they take.

        Instructions are those of a round of the inner loop, or else two calls, of which the longer one does so many
        pixels more.
        """
        number, address, pixels, sizes = self.rows[name]
        short, long = (self.executed(number, address, size) for size in sizes)
        more = pixels * (sizes[1] - sizes[0])
        try:
            addresses, rounds = inner_loop(short, long)
        except ValueError:
            return more, [([self.code[at] for at in call if at in self.code], Stack()) for call in (short, long)]
        stack = Stack()
        for at in long[:long.index(addresses[0])]:
            stack.follow(*self.code[at])
        return more / rounds, [([self.code[at] for at in addresses], stack)]

    def measure(self, names):
        """{row: (figures per pixel, text of the loop or None)}"""
        with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
            found = dict(zip(names, pool.map(self.loop, names)))
        measured = {}
        for whole_calls in (False, True):
            rows = {name: row for name, row in found.items() if (len(row[1]) == 2) == whole_calls}
            figures = {name: difference([counts(*code) for code in codes]) for name, (_, codes) in rows.items()}
            texts = [assembly(code) for _, codes in rows.values() for code, _ in codes]
            for processor in self.family["processors"] if texts else []:
                taken = iter(zip(cycles(self.mca, self.family, processor, texts, (0, 1) if whole_calls else (100, 200)),
                                 occupied(self.mca, self.family, processor, texts)))
                for name, (_, codes) in rows.items():
                    figures[name].update(difference([dict(zip((processor, access_of(processor)), next(taken)))
                                                     for _ in codes]))
            for name, (pixels, codes) in rows.items():
                measured[name] = ({kind: figure / pixels for kind, figure in figures[name].items()},
                                  None if whole_calls else assembly(codes[0][0]))
        return measured


def weighted(measured, terms):
    """The sum of multiples of rows, or None where one is missing."""
    if not terms or any(name not in measured for name in terms):
        return None
    kinds = next(iter(measured.values()))
    return {kind: sum(factor * measured[name][kind] for name, factor in terms.items()) for kind in kinds}


def number(x):
    return "–" if x is None else f"{x:.2f}"


def table(head, lines):
    width = [max(len(line[i]) for line in [head, *lines]) for i in range(len(head))]
    for line in [head, ["-" * w for w in width], *lines]:
        print("| " + " | ".join(cell.ljust(w) for cell, w in zip(line, width)) + " |")
    print()


def report(family, results, chosen):
    compilers = list(results)
    above = set()
    peers = {n.removeprefix("libyuv "): m for n, m in results[compilers[0]].items() if n.startswith("libyuv ")}
    names = [n for n in dict.fromkeys(n for c in compilers for n in results[c]) if not n.startswith("libyuv ")]
    rows = []
    for name in [*names, *(s for s in SUMS if chosen.search(s))]:
        ours = [weighted(results[c], SUMS.get(name, {name: 1})) for c in compilers]
        rows.append((name, ours, weighted(peers, PEERS.get(name))))
    of = lambda m, kind: m and m[kind]
    print(f"## {family['title']}: the inner loops\n")
    kinds = ["instructions", "moves", "spills"]
    table(["per pixel", *(f"{kind} {who}" for kind in kinds for who in [*compilers, "libyuv"])],
          [[name, *(number(of(m, kind)) for kind in kinds for m in [*ours, peer])] for name, ours, peer in rows])
    for processor in family["processors"]:
        print(f"## {family['title']}, {processor}: cycles\n")
        compared = [(m[processor] / peer[processor], is_bound(m, peer, processor))
                    for _, ours, peer in rows if peer for m in ours if m]
        above |= {name for name, ours, peer in rows if peer for m in ours if m and m[processor] > .8 * peer[processor]}
        if compared:
            between = [bound for ratio, bound in compared if .8 < ratio <= 1]
            print(f"Of {len(compared)} comparisons, {sum(r <= .8 for r, _ in compared)} are at 0.8 of libyuv's cycles or "
                  f"below, {sum(between)} at 1.0 or below where no more can be had (=), "
                  f"{len(between) - sum(between)} others at 1.0 or below, {sum(r > 1 for r, _ in compared)} above; "
                  f"the largest is {max(compared)[0]:.2f}.\n")
        ratio = lambda m, peer: (number(m[processor] / peer[processor]) + " =" * is_bound(m, peer, processor)
                                 if m and peer else number(None))
        table(["per pixel", *compilers, "libyuv", *(f"{c} / libyuv" for c in compilers)],
              [[name, *(number(of(m, processor)) for m in [*ours, peer]), *(ratio(m, peer) for m in ours)]
               for name, ours, peer in rows])
    return above


def reasons(above):
    """Why rows are above the goal."""
    if not above:
        return
    print("## What binds the rows above 0.8\n")
    known = {name: rows for rows in BINDS for name in above if re.fullmatch(rows, name)}
    for rows, reason in BINDS.items():
        names = sorted(name for name in known if known[name] == rows)
        if names:
            print("\n".join(textwrap.wrap(f"{', '.join(names)}: {reason}", 120, initial_indent="- ",
                                          subsequent_indent="  ", break_long_words=False, break_on_hyphens=False)))
    unknown = sorted(above - known.keys())
    if unknown:
        sys.exit(f"BINDS does not say why these are above 0.8: {', '.join(unknown)}")


def first_line(*command):
    return subprocess.run(command, capture_output=True, text=True, check=True).stdout.strip().splitlines()[0]


def head(llvm):
    mca = re.search(r"LLVM version [\d.]+", subprocess.run([f"{llvm}/llvm-mca", "--version"], capture_output=True,
                                                           text=True, check=True).stdout)[0]
    print("# The NEON rows, on paper\n")
    print(f"Made by `./run bench --arm` on {datetime.date.today()}: {first_line('aarch64-linux-gnu-g++', '--version')}, "
          f"{first_line('clang++', '--version')}, llvm-mca of {mca}.\n")
    print("No ARM processor was timed. These are the instructions that one round of a row's inner loop executes, and "
          "the cycles\nthat llvm-mca's models give for it, per pixel (per sample or byte where a row moves those), with "
          "memory in the first\ncache. Moves are between vector registers; spills are loads and stores of vectors on "
          "the stack, constants\namong them. Rows named \"two\" do two lines at once. libyuv's rows are Debian's: its "
          "archive for arm64, and for ARMv7 its\nsources by GCC. Sums of rows: \"to yuv420\" is half a row with chroma "
          "and half a row without.\n")
    print("The models make latencies weigh more than they do on Cortex-A53 and A55, and loads and stores of "
          "structures less on\nCortex-A9, where 128 bits also cost as much as 64. Instructions that they do not know "
          "are left out of the cycles.\nRows without a steady loop are measured by two whole calls. Rows of the "
          "resampler make one line half way between two,\nby a plan for any ratio; libyuv has rows of their own for "
          "4 to 3 and 2 to 1.\n")
    print("The goal is 0.8 of libyuv's cycles. Where the loads and stores alone, libyuv's as well as ours, take more "
          "than that,\nhowever they are ordered, it cannot be had: such ratios are marked (=), and 1.0 is the goal. "
          "What binds other rows\nabove 0.8 stands at the end of this page.\n")


def main():
    parser = argparse.ArgumentParser(description=__doc__.split("\n\n")[0])
    parser.add_argument("--llvm", required=True, help="the folder of llvm-mca and llvm-objdump")
    parser.add_argument("--rows", default="", help="regular expression: the rows to measure")
    parser.add_argument("--show", action="store_true", help="print the loops too")
    parser.add_argument("probes", nargs="+", metavar="FAMILY:COMPILER:PROGRAM")
    args = parser.parse_args()
    chosen = re.compile(args.rows)
    wanted = lambda name: chosen.search(name) or any(
        chosen.search(whole) and name.removeprefix("libyuv ") in terms
        for sums in (SUMS, PEERS) for whole, terms in sums.items())
    head(args.llvm)
    above = set()
    families = collections.defaultdict(dict)
    for probe in args.probes:
        family, compiler, program = probe.split(":", 2)
        families[family][compiler] = program
    for name, programs in families.items():
        results = {}
        for compiler, program in programs.items():
            probe = Probe(program, FAMILIES[name], args.llvm)
            # libyuv's rows are the same in each program.
            rows = [row for row in probe.rows if wanted(row) and not (results and row.startswith("libyuv "))]

            measured = probe.measure(rows)
            results[compiler] = {row: figures for row, (figures, _) in measured.items()}
            if args.show:
                for row, (_, text) in measured.items():
                    if text:
                        print(f"### {name}, {compiler}, {row}\n\n```\n{text}```\n")
        above |= report(FAMILIES[name], results, chosen)
    reasons(above)


if __name__ == "__main__":
    sys.exit(main())

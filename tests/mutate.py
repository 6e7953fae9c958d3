#!/usr/bin/env python3
"""Small faults in the sources, one at a time: which of them do the tests not see?

    ./run mutate 50               # 50 faults, about 20 s each
    ./run mutate --seed 7 300     # other faults; what an earlier run has done is not done again
    ./run mutate --only 'simgp/vector/*' 20
    ./run mutate --again          # those that were not seen, against the tests as they are now

Works on copies of the tree. One has the scalar rows and those of one instruction set; the tests are those of
the fault's area. Others have every vector layer, as x86 and both ARMs compile it, and next to no rows: a fault
there is for simd_test alone, which is to know all that rows count on. A fault that does not compile, or that
makes the same code, is replaced by another."""

import argparse
import difflib
import fnmatch
import functools
import hashlib
import json
import os
import pathlib
import random
import re
import resource
import shutil
import signal
import subprocess
import sys
import time

SOURCE = pathlib.Path(__file__).resolve().parent.parent

# Which tests belong to which sources, the narrowest first: (names of files, test programs).
TESTS = [
    ("tools/probe.cpp tools/stream.* tools/h264.* tools/description.*", "probe"),
    ("tools/main.h tools/text.* tools/fault.h tools/progress.*", "convert probe"),
    ("tools/play*", "play"),
    ("tools/*", "convert"),
    ("simgp/vector/any*.h simgp/any.cpp simgp/csc_any.cpp rows/any.h", "csc_any"),
    ("*/deblock.*", "deblock"),
    ("simgp/vector/steps.h", "layout yuv2rgb rgb2yuv csc_any"),
    ("*/dither.*", "dither resize_rot csc"),
    ("*/layout.*", "layout tile csc_any"),
    ("simgp/vector/resize_plan.h */resize.* simgp/resample.*", "resize resize_csc resize_rot irsz"),
    ("simgp/resize_csc.*", "resize_csc csc_any"),
    ("simgp/resize_rot.*", "resize_rot"),
    ("*/rgb2yuv.* simgp/vector/source.h", "rgb2yuv csc_any csc"),
    ("*/rotate.* simgp/turn.h", "rotate resize_rot"),
    ("simgp/tile.cpp */tile.h simgp/tile_offset.h", "tile csc csc_any resize_csc"),
    ("*/yuv2rgb.* simgp/vector/matrix.h simgp/vector/packer.h simgp/walk.h simgp/column.*",
     "yuv2rgb packed2rgb csc csc_any resize_csc dither tile rgb2yuv"),
    ("simgp/packed2rgb.cpp", "packed2rgb csc"),
    ("simgp/copy.cpp", "copy csc"),
    ("simgp/csc.cpp simgp/dispatch.h rows/conversions.h", "csc csc_any resize_csc"),
    ("simgp/csc_rot.cpp", "rotate csc"),
    ("simgp/pixel.h", "rgb2yuv csc_any dither resize_rot yuv2rgb"),
    ("scmn/irsz.*", "irsz"),
    ("scmn/bits.*", "bits"),
    ("simgp/describe.h", "describe"),
    ("scmn/tags.*", "tags"),
    ("scmn/*keyframe.* rows/keyframe.h", "keyframe"),
    ("scmn/*mem.* rows/mem.h", "mem"),
    ("rows/choose.*", "choose"),
    ("simd/*", "simd"),
    ("*", "csc csc_any layout tile rotate copy resize resize_rot rgb2yuv dither"),
]
FILES = ["simgp/*.cpp", "simgp/*.h", "simgp/vector/*.h", "scmn/*.cpp", "scmn/*.h", "scmn/vector/*.h", "rows/*",
         "tools/*.cpp", "tools/*.h", "simd/*.h"]
# Public headers are declarations, but for these.
WITH_CODE = ["scmn/bits.h", "simgp/describe.h"]
LEFT_OUT = ["rows/unit.cpp", "scmn/version.cpp",
            "simgp/vector/fetch.h",  # hints to the caches, which change no result
            "simd/limits.h",  # refuses to compile, and makes no code
            "tools/check.cpp", "tools/trial*"]  # simgp-check, a test itself

# Which copies judge a file, and what a copy is made of: CMake's options, the processor that runs it, and what
# is cut from the tree.
COPIES_OF = [("simd/neon.h", "aarch64 armv7"), ("simd/*", "x86"), ("rows/choose.*", "choose"),
             ("simgp/vector/any_channels.h", "lanes"),
             ("simgp/vector/steps.h simgp/vector/any.h", "rows lanes"), ("*", "rows")]
NO_LANES = ("tests/CMakeLists.txt", r"if\(NOT SIMGP_BIG_ENDIAN\)", "if(OFF)")  # a fault is in those rows, too
ONE_SET = ("cmake/targets.cmake", r"TARGETS sse41 avx2 avx512\)", "TARGETS avx2)")


def areas(names):
    return "cmake/targets.cmake", r"\(SIMGP_AREAS\n.*?\)", f"(SIMGP_AREAS {names})"


NO_TOOLS = "-DSIMGP_BUILD_TOOLS=OFF"
TOOLCHAINS = "-DCMAKE_TOOLCHAIN_FILE=cmake/toolchains/"
COPIES = {
    "rows": ([], [], [ONE_SET, NO_LANES]),
    "choose": ([NO_TOOLS], [], [areas("scmn/mem simgp/layout simgp/yuv2rgb")]),  # the rows that its test looks at
    "lanes": ([NO_TOOLS, "-DSIMGP_VECTOR=OFF"], [],  # their loops are those of the ARMs
              [areas("simgp/any simgp/layout simgp/rgb2yuv simgp/tile simgp/yuv2rgb")]),
    "x86": ([NO_TOOLS], [], [areas("scmn/keyframe"), NO_LANES]),
    "aarch64": ([NO_TOOLS, TOOLCHAINS + "aarch64-linux-gnu.cmake"],
                ["qemu-aarch64", "-L", "/usr/aarch64-linux-gnu"], [areas("scmn/keyframe"), NO_LANES]),
    "armv7": ([NO_TOOLS, TOOLCHAINS + "arm-linux-gnueabihf.cmake"],
              ["qemu-arm", "-L", "/usr/arm-linux-gnueabihf"], [areas("scmn/keyframe"), NO_LANES]),
}

SWAPS = {"+": "-", "-": "+", "*": "/", "/": "*", "%": "/", "<": "<=", "<=": "<", ">": ">=", ">=": ">",
         "==": "!=", "!=": "==", "&&": "||", "||": "&&", "<<": ">>", ">>": "<<", "&": "|", "|": "&",
         "+=": "-=", "-=": "+=", "min": "max", "max": "min", "true": "false", "false": "true",
         "even": "odd", "odd": "even", "width": "height", "height": "width"}
# Parts of the names of instructions: saturating or not, signed or not, rounding or not, the other half.
INSTRUCTIONS = dict(pair.split("/") for pair in (
    "adds/add subs/sub unpacklo/unpackhi unpackhi/unpacklo srli/srai srai/srli packus/packs packs/packus "
    "epu8/epi8 epu16/epi16 mulhi/mullo mulhrs/mulhi min/max max/min "
    "qadd/add qsub/sub rhadd/hadd shrn/rshrn sra/rsra sri/sli sli/sri get_low/get_high get_high/get_low "
    "qmovun/movn qshlu/shl qrdmulh/qdmulh addhn/raddhn mlal/mlsl mlsl/mlal cgt/cge bic/and").split())
SWAPS |= INSTRUCTIONS


def swapped(m, _):
    return SWAPS[m[1]]


def other_constant(m, choice):
    value = int(m[1], 8 if re.match(r"0\d", m[1]) else 0)
    others = [value + 1] + [value - 1] * (value > 0)
    return (hex if m[1].startswith("0x") else str)(choice(others))


def other_order(m, _):
    return f"{m[3]}{m[2]}{m[1]}"


# What a fault does: where it can (group 1 is replaced, but for the order of operands), and by what.
FAULTS = {
    "constant": (r"(?<![\w.'])(0x[0-9A-Fa-f]+|\d+)(?=[uUlL]*(?![\w.']))", other_constant),
    "sign": (r"(?<= )([+-]=?)(?= )", swapped),
    "product": (r"(?<= )([*/%])(?= )", swapped),
    "comparison": (r"(?<= )(<=?|>=?|==|!=)(?= )", swapped),
    "logic": (r"(?<= )(&&|\|\|)(?= )", swapped),
    "negation": (r"(?<![\w!])(!)(?=[\w(])", lambda m, _: ""),
    "bits": (r"(?<= )(<<|>>|[&|])(?= )", swapped),
    "word": (r"(?<![\w])(min|max|true|false|even|odd|width|height)(?!\w)", swapped),
    "instruction": (rf"(?:(?<=_)|\bv)({'|'.join(INSTRUCTIONS)})(?=q?_|\()", swapped),
    "operands": (r"(?<=\()([\w.\[\]+* ]+)(, )([\w.\[\]+* ]+)(?=[,)])", other_order),
    "operands of a difference": (r"(?<![\w.\])] )(?<![\w.])([\w.]+)( - )([\w.]+)(?![\w.(\[])", other_order),
    "dropped line": (r"^ +((?!return\b|const|using|static|auto|typedef|template|struct|\w+_t \w+;)[^{}]*[;])$",
                     lambda m, _: ""),
}


def code_lines(text):
    """Numbers of the lines that are code, and their text with comments and strings blanked out."""
    blank = lambda m: re.sub(r"[^\n]", "~", m[0])
    text = re.sub(r'R"\(.*?\)"|//[^\n]*|/\*.*?\*/|"(\\.|[^"\\\n])*"|\'(\\.|[^\'\\\n])\'', blank, text, flags=re.S)
    skipping = False
    for number, line in enumerate(text.split("\n")):
        directive = skipping or line.lstrip().startswith("#")
        skipping = directive and line.endswith("\\")
        if directive or re.match(r"\s*(static_assert|template|using|namespace|extern|\}?\s*$)", line):
            continue
        yield number, line


def faults_of(path, choice):
    """All faults of a file by kind: {kind: [(line number, line, faulty line), ...]}."""
    text = path.read_text()
    lines = text.split("\n")
    found = {}
    for number, masked in code_lines(text):
        for kind, (where, by) in FAULTS.items():
            for m in re.finditer(where, masked):
                new = by(m, choice)
                start, end = m.span() if kind.startswith("operands") else m.span(1)
                faulty = lines[number][:start] + new + lines[number][end:]
                if "~" not in new and faulty != lines[number]:
                    found.setdefault(kind, []).append((number, lines[number], faulty.rstrip()))
    return found


class Copy:
    """A copy of the tree, its build and its tests."""

    def __init__(self, folder, name, jobs, tests, limit):
        options, self.runner, self.cuts = COPIES[name]
        folder /= name
        self.tree, self.build, self.jobs = folder / "tree", folder / "build", jobs
        self.environment = dict(os.environ, CCACHE_BASEDIR=str(self.tree), CCACHE_NOHASHDIR="1",
                                SIMGP_TEST_QUICK="1", GTEST_FAIL_FAST="1", GTEST_BRIEF="1")
        self.environment.pop("SIMGP_TEST_EXPECT_TARGET", None)
        self.update()
        launcher = "ccache" if shutil.which("ccache") else ""
        subprocess.run(["cmake", "-S", self.tree, "-B", self.build, "-G", "Ninja", "-DSIMGP_BUILD_BENCH=OFF",
                        "-DCMAKE_BUILD_TYPE=Release", "-DCMAKE_CXX_FLAGS_RELEASE=-O1", *options,
                        f"-DCMAKE_C_COMPILER_LAUNCHER={launcher}", f"-DCMAKE_CXX_COMPILER_LAUNCHER={launcher}"],
                       check=True, cwd=self.tree, stdout=subprocess.DEVNULL)
        print(f"Building and running the tests as they are ({name}):", *tests, flush=True)
        if not self.make(tests):
            sys.exit("The tests do not build.")
        self.limits = {}
        for test in tests:
            start = time.time()
            if self.fails(test, 10 * limit):
                sys.exit(f"{test}_test fails without a fault.")
            self.limits[test] = limit + 3 * (time.time() - start)
            print(f"  {test}: {time.time() - start:.1f} s", flush=True)
        self.baseline = self.objects()

    def update(self):
        names = subprocess.run(["git", "ls-files", "-co", "--exclude-standard"], cwd=SOURCE, check=True,
                               capture_output=True, text=True).stdout.splitlines()
        for name in names:
            if (SOURCE / name).is_file():
                self.put(name, self.cut(name, (SOURCE / name).read_bytes()))
                os.chmod(self.tree / name, (SOURCE / name).stat().st_mode)

    def cut(self, name, content):
        for file, what, by in self.cuts:
            if name == file:
                content, times = re.subn(what.encode(), by.encode(), content, flags=re.S)
                assert times == 1, (name, what)
        return content

    def put(self, name, content):
        path = self.tree / name
        if not path.exists() or path.read_bytes() != content:
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_bytes(content)

    def objects(self, since=0.0):
        """Hashes of the objects of what is tested, without those of the tests themselves."""
        return {path: hashlib.sha1(path.read_bytes()).digest() for path in self.build.rglob("*.o")
                if "_test.dir" not in str(path) and path.stat().st_mtime >= since}

    def make(self, tests):
        """Whether it builds."""
        targets = [f"{test}_test" for test in tests]
        return subprocess.run(["ninja", "-C", self.build, f"-j{self.jobs}", *targets], env=self.environment,
                              stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL).returncode == 0

    def fails(self, test, limit):
        def bounds():  # what a faulty program may use up
            resource.setrlimit(resource.RLIMIT_CORE, (0, 0))
            resource.setrlimit(resource.RLIMIT_FSIZE, (1 << 30, 1 << 30))
            resource.setrlimit(resource.RLIMIT_DATA, (4 << 30, 4 << 30))
        process = subprocess.Popen([*self.runner, self.build / "tests" / f"{test}_test"], cwd=self.build,
                                   env=self.environment, stdin=subprocess.DEVNULL, stdout=subprocess.DEVNULL,
                                   stderr=subprocess.DEVNULL, start_new_session=True, preexec_fn=bounds)
        try:
            return process.wait(limit) != 0
        except subprocess.TimeoutExpired:
            return True
        finally:
            try:
                os.killpg(process.pid, signal.SIGKILL)  # what it started, too
            except ProcessLookupError:
                pass
            process.wait()


def first_match(table, name):
    return next(found.split() for patterns, found in table
                if any(fnmatch.fnmatch(name, pattern) for pattern in patterns.split()))


def tests_of(name):
    return first_match(TESTS, name)


def place(fault, lines):
    """Where the line of a fault is now, or None: the file may have changed since."""
    number, before = fault["line"], fault["before"]
    if lines[number:number + 1] == [before]:
        return number
    return lines.index(before) if lines.count(before) == 1 else None


def show(fault):
    name = fault["file"]
    lines = (SOURCE / name).read_text().split("\n")
    at = place(fault, lines)
    if at is None:
        return f"{name}: no longer there: {fault['before'].strip()}"
    faulty = lines[:at] + [fault["after"]] + lines[at + 1:]
    return "\n".join(difflib.unified_diff(lines, faulty, name, name, n=2, lineterm=""))


def run_fault(copies, fault):
    """"nothing" if it does not compile, "same" if the code is the same, the test that saw it, or None."""
    results = []
    for name in first_match(COPIES_OF, fault["file"]):
        results.append(run_in(copies(name), fault))
        if results[-1] not in ("same", None):
            return results[-1]
    return None if None in results else "same"


def run_in(copy, fault):
    name, tests = fault["file"], tests_of(fault["file"])
    original = copy.cut(name, (SOURCE / name).read_bytes())
    lines = original.decode().split("\n")
    number = place(fault, lines)
    if number is None:
        return "nothing"
    lines[number] = fault["after"]
    start = time.time() - 1
    copy.put(name, "\n".join(lines).encode())
    try:
        if not copy.make(tests[:1]):
            return "nothing"
        if all(copy.baseline.get(path) == code for path, code in copy.objects(start).items()):
            return "same"
        for test in tests:
            if not copy.make([test]):
                return "nothing"
            if copy.fails(test, copy.limits[test]):
                return test
        return None
    finally:
        copy.put(name, original)


def sources(patterns, public):
    for pattern in FILES:
        for path in sorted(SOURCE.glob(pattern)):
            name = str(path.relative_to(SOURCE))
            is_one_of = lambda table: any(fnmatch.fnmatch(name, p) for p in table)
            has_code = name not in public or name in WITH_CODE
            if has_code and is_one_of(patterns) and not is_one_of(LEFT_OUT):
                yield name, sum(1 for _ in code_lines(path.read_text()))


def random_fault(seed, files):
    """The kinds are as frequent as each other, files according to their length."""
    draw = random.Random(seed)
    name = draw.choices([f for f, _ in files], [lines for _, lines in files])[0]
    kinds = faults_of(SOURCE / name, draw.choice)
    if not kinds:
        return None
    kind = draw.choice(sorted(kinds))
    number, before, after = draw.choice(kinds[kind])
    return {"file": name, "line": number, "kind": kind, "before": before, "after": after}


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("count", nargs="?", type=int, default=50, help="how many faults (50)")
    parser.add_argument("--seed", type=int, default=1)
    parser.add_argument("--only", action="append", help="files, as shell patterns")
    parser.add_argument("--again", action="store_true", help="run once more what was not seen")
    parser.add_argument("--limit", type=float, default=60, help="seconds for each test program, beyond three times what it takes (60)")
    parser.add_argument("--jobs", type=int, default=os.cpu_count())
    parser.add_argument("--folder", type=pathlib.Path, default=SOURCE / "build" / "mutate")
    arguments = parser.parse_args()

    folder = arguments.folder.resolve()
    folder.mkdir(parents=True, exist_ok=True)
    log = folder / f"seed-{arguments.seed}.json"
    done = json.loads(log.read_text()) if log.exists() else {}
    public = set(re.findall(r"\b(?:simgp|scmn)/\w+\.h", (SOURCE / "CMakeLists.txt").read_text()))
    files = list(sources(arguments.only or ["*"], public))

    @functools.cache
    def copies(name):
        tests = {test for file, _ in files if name in first_match(COPIES_OF, file) for test in tests_of(file)}
        return Copy(folder, name, arguments.jobs, sorted(tests), arguments.limit)

    def settle(key, fault):
        start = time.time()
        fault["seen"] = run_fault(copies, fault)
        if fault["seen"] in ("nothing", "same"):
            return False
        done[key] = fault
        log.write_text(json.dumps(done, indent=1))
        print(f"{key}: {fault['file']}:{fault['line'] + 1}: {fault['kind']}: seen by {fault['seen']}, "
              f"{time.time() - start:.0f} s", flush=True)
        if fault["seen"] is None:
            print(show(fault), flush=True)
        return True

    if arguments.again:
        for key in [key for key, fault in done.items() if fault["seen"] is None]:
            if not settle(key, dict(done[key])):
                print(f"{key}: {done[key]['file']}: the line is no longer there")
                del done[key]
                log.write_text(json.dumps(done, indent=1))
    else:
        chosen = ",".join(arguments.only or [])
        one = lambda fault: (fault["file"], fault["before"], fault["after"])
        tried = {one(fault) for fault in done.values()}
        for i in range(arguments.count):
            key = f"{chosen}#{i}"
            attempt = 0
            while key not in done and attempt < 1000:
                fault = random_fault(f"{arguments.seed}/{key}/{attempt}", files)
                attempt += 1
                if fault and one(fault) not in tried:
                    tried.add(one(fault))
                    settle(key, fault)

    unseen = [fault for fault in done.values() if fault["seen"] is None]
    print(f"\n{len(done)} faults, {len(done) - len(unseen)} seen, {len(unseen)} not seen "
          f"({100 * (len(done) - len(unseen)) / max(1, len(done)):.1f} %)")
    for fault in unseen:
        print(f"\n{show(fault)}")


if __name__ == "__main__":
    main()

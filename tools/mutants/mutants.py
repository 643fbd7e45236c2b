#!/usr/bin/env python3
"""Changes the libraries one place at a time and looks whether a test fails: what survives is what no test asks.

    tools/mutants/mutants.py                              # 1,000 mutants of engine, photo and jni, any
    tools/mutants/mutants.py --count 50 photo/metadata    # 50 of a folder or file; --count 0: all
    tools/mutants/mutants.py --again                      # those that survived, once more
    tools/mutants/mutants.py --show                       # what is known

All mutants are one program: each edit stands in a copy of the sources (build/mutants) behind a switch that
is read as the program starts (edits.py, switch.h), and the tests are built of that copy once. Every test
runs alone and tells which switches it asks; then every mutant runs those tests that ask for its own, in
the folder of the same name first, up to the first that fails. One that takes four times as long as ever,
or memory without end, has failed. Edits that do not compile are left out, and so is what is computed while
compiling: no test asks for its switch.

What was found is kept in build/mutants/results.jsonl, so that the next run goes on. survivors.txt has those
that survive for a reason: the path, the line as it was, as it is changed, and why that is no fault, parted
by " | "; path and lines may have * in them.
"""

import argparse
import collections
import concurrent.futures
import fnmatch
import glob
import json
import os
import pathlib
import random
import re
import resource
import shutil
import subprocess
import sys
import tempfile
import threading
import time

import edits

ROOT = pathlib.Path(__file__).resolve().parents[2]
WORK = ROOT / "build/mutants"
COPY = WORK / "source"
BUILD = WORK / "build"
FOLDERS = ["image_processing", "photo", "jni"]
KINDS = ["killed", "survived", "with a reason"]
JOBS = os.cpu_count() or 1
MEMORY = 6 << 30  # of a test: a mutant may want any
# Kernels for one instruction set: the others are the same lines.
FLAGS = "-O1 -DNDEBUG -w -Wno-narrowing"
MACHINE = "-DHWY_COMPILE_ONLY_STATIC -mavx2 -mfma -mf16c -mbmi -mbmi2 -mlzcnt -mpclmul -maes"


class Mutant:
    def __init__(self, path: str, edit: edits.Edit, text: str, nth: int) -> None:
        self.path, self.edit, self.line = path, edit, edit.line(text)
        self.before, self.after = edit.shown(text)
        self.key = " | ".join([path, self.before, self.after, str(nth)])


def read_tree() -> dict[str, bytes]:
    """The files of the tree as they are now; whoever works on them meanwhile does not disturb."""
    command = ["git", "ls-files", "-coz", "--exclude-standard"]
    listed = subprocess.run(command, cwd=ROOT, check=True, capture_output=True, text=True).stdout
    return {path: (ROOT / path).read_bytes() for path in sorted(listed.split("\0")) if (ROOT / path).is_file()}


def all_mutants(tree: dict[str, bytes]) -> list[Mutant]:
    found = []
    for path, content in tree.items():
        if not path.startswith(tuple(folder + "/" for folder in FOLDERS)) or not path.endswith((".cpp", ".h")):
            continue
        text, seen = content.decode(), collections.Counter()
        for edit in edits.edits(text):
            shown = edit.shown(text)
            found.append(Mutant(path, edit, text, seen[shown]))
            seen[shown] += 1
    return found


def numbered(mutants: list[Mutant]) -> dict[int, Mutant]:
    """Mutants by the number of their switch: the one it ever had, so that files that did not change are not compiled."""
    file = WORK / "numbers.json"
    numbers = json.loads(file.read_text()) if file.exists() else {}
    for mutant in mutants:
        numbers.setdefault(mutant.key, len(numbers))
    file.write_text(json.dumps(numbers))
    return {numbers[mutant.key]: mutant for mutant in mutants}


def write(path: pathlib.Path, content: bytes) -> None:
    """What stays as it was keeps its time, and is not compiled again."""
    if not path.exists() or path.read_bytes() != content:
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_bytes(content)


class Programs:
    """The tests, built of all mutants at once."""

    def __init__(self, tree: dict[str, bytes], mutants: dict[int, Mutant]) -> None:
        self.tree, self.mutants = tree, mutants
        self.refused_file = WORK / "refused.json"
        self.refused = set(json.loads(self.refused_file.read_text())) if self.refused_file.exists() else set()
        self.programs: list[str] = []

    def write_sources(self) -> None:
        numbered = collections.defaultdict(list)
        for number, mutant in self.mutants.items():
            if mutant.key not in self.refused:
                numbered[mutant.path].append((number, mutant.edit))
        for path, content in self.tree.items():
            if path in numbered:
                # One line more: `refuse` counts on it.
                text = '#include "tools/mutants/switch.h"\n' + edits.switched(content.decode(), numbered[path])
                content = text.encode()
            write(COPY / path, content)
            if content.startswith(b"#!"):
                os.chmod(COPY / path, 0o755)

    def configure(self) -> None:
        command = ["cmake", "-S", str(COPY), "-B", str(BUILD), "-G", "Ninja", "-DCMAKE_BUILD_TYPE=Release"]
        for option in [
            f"CMAKE_CXX_FLAGS_RELEASE={FLAGS}",
            f"CMAKE_CXX_FLAGS={MACHINE} -I{COPY}",
            "PELORIN_UNITY=ON",
            "PELORIN_INSTALL=OFF",
            "PELORIN_COMMAND_TESTS=OFF",
            "PELORIN_JAVA_TESTS=OFF",
        ]:
            command.append("-D" + option)
        subprocess.run(command, check=True, stdout=subprocess.DEVNULL)
        listed = subprocess.run(
            ["ninja", "-C", str(BUILD), "-t", "targets", "all"], check=True, capture_output=True, text=True
        ).stdout
        names = [line.split(": ")[0] for line in listed.splitlines() if "EXECUTABLE_LINKER" in line]
        self.programs = [
            name
            for name in names
            if name.startswith("tests/")
            and name.endswith(("_test", "_tests"))
            and not name.startswith(("tests/cli/", "tests/browser/"))
            and "command" not in name  # which would build the command, too
        ]

    def refuse(self, log: str) -> int:
        """Leaves out the edits at which the compiler found errors; how many they are."""
        before = len(self.refused)
        place = re.compile(re.escape(str(COPY)) + r"/((?:" + "|".join(FOLDERS) + r")/[^:\s]+):(\d+):(\d+)")
        for block in re.split(r"\n(?=[^\n]*\berror: )", log):
            if "error: " not in block.split("\n", 1)[0]:
                continue
            for path, line, column in place.findall(block):
                text = (COPY / path).read_text().split("\n")[int(line) - 1]
                numbers = [int(n) for n in re.findall(r"quenbyMutant\((\d+)\)", text.encode()[: int(column)].decode(errors="ignore"))]
                live = [n for n in numbers if n in self.mutants and self.mutants[n].key not in self.refused]
                if not live:  # of all that begin on the line
                    every = [int(n) for n in re.findall(r"quenbyMutant\((\d+)\)", text)]
                    live = [n for n in every if self.mutants[n].key not in self.refused]
                    self.refused.update(self.mutants[n].key for n in live)
                else:
                    self.refused.add(self.mutants[live[-1]].key)
                if live:
                    break
        return len(self.refused) - before

    def build(self) -> None:
        rounds = 0
        while True:
            self.write_sources()
            if not self.programs:
                self.configure()
            done = subprocess.run(
                ["ninja", "-C", str(BUILD), "-k", "0", "-j", str(JOBS), *self.programs],
                capture_output=True,
                text=True,
                errors="replace",
            )
            (WORK / "build.log").write_text(done.stdout)
            if done.returncode == 0:
                return
            rounds += 1
            refused = self.refuse(done.stdout)
            print(f"round {rounds}: {refused} edits do not compile", file=sys.stderr, flush=True)
            self.refused_file.write_text(json.dumps(sorted(self.refused)))
            if refused == 0:  # errors that have no edit beside them, but come of one: all of the file's
                files = set(re.findall(re.escape(str(COPY)) + r"/(\S+?):\d+:\d+: error: ", done.stdout))
                whole = {mutant.key for mutant in self.mutants.values() if mutant.path in files} - self.refused
                self.refused |= whole
                refused = len(whole)
                self.refused_file.write_text(json.dumps(sorted(self.refused)))
            if refused == 0:
                sys.exit(f"the copy does not compile; see {WORK / 'build.log'}")


class Test:
    def __init__(self, program: str, name: str) -> None:
        self.program, self.name = program, name
        self.seconds, self.reached = 0.0, frozenset()


def limits(seconds: int):
    def apply() -> None:
        resource.setrlimit(resource.RLIMIT_CPU, (seconds, seconds + 1))
        resource.setrlimit(resource.RLIMIT_AS, (MEMORY, MEMORY))
        resource.setrlimit(resource.RLIMIT_CORE, (0, 0))
        resource.setrlimit(resource.RLIMIT_FSIZE, (1 << 30, 1 << 30))

    return apply


def run(program: str, tests: list[str], cpu_seconds: float, **environment: str) -> tuple[bool, float]:
    """Whether the tests of a program pass, in a folder of their own, and how many seconds of CPU time they take."""
    with tempfile.TemporaryDirectory(prefix="mutants-", dir="/dev/shm") as folder:
        process = subprocess.Popen(
            [str(BUILD / program), "--gtest_filter=" + ":".join(tests), "--gtest_brief=1", "--gtest_fail_fast"],
            cwd=folder,
            env={**os.environ, "TMPDIR": folder, "MALLOC_PERTURB_": "165", **environment},
            stdin=subprocess.DEVNULL,
            stdout=subprocess.DEVNULL,
            stderr=subprocess.DEVNULL,
            preexec_fn=limits(int(cpu_seconds) + 1),
            start_new_session=True,
        )
        # For those that wait for ever: time on the wall is the machine's, busy as it may be.
        hangs = threading.Timer(20 * cpu_seconds + 60, os.killpg, (process.pid, 9))
        hangs.start()
        _, status, used = os.wait4(process.pid, 0)
        hangs.cancel()
        process.returncode = os.waitstatus_to_exitcode(status)
        try:
            os.killpg(process.pid, 9)
        except ProcessLookupError:
            pass
        return process.returncode == 0, used.ru_utime + used.ru_stime


def find_tests(programs: list[str], longest: float) -> list[Test]:
    """Every test that passes as things are within so many seconds of CPU time, with what it takes and which switches
    it asks."""
    store = WORK / "tests.jsonl"
    lines = store.read_text().splitlines() if store.exists() else []
    recorded = {(entry["program"], entry["built"], entry["name"]): entry for entry in map(json.loads, lines)}
    tests = []
    for program in programs:
        listed = subprocess.run([str(BUILD / program), "--gtest_list_tests"], capture_output=True, text=True).stdout
        suite = ""
        for line in listed.splitlines():
            name = line.split("#")[0].rstrip()
            if name and not name.startswith(" "):
                suite = name
            elif name and "DISABLED_" not in suite + name:
                tests.append(Test(program, suite + name.strip()))

    def record(test: Test) -> bool:
        built = os.stat(BUILD / test.program).st_mtime
        entry = recorded.get((test.program, built, test.name))
        if entry is None:
            with tempfile.TemporaryDirectory(prefix="mutants-reached-", dir="/dev/shm") as folder:
                passed, seconds = run(test.program, [test.name], 2 * longest, QUENBY_MUTANTS_REACHED=folder + "/")
                if passed and seconds > 0.5:  # much of which is for the list
                    passed, seconds = run(test.program, [test.name], longest)
                files = [pathlib.Path(file).read_text().split() for file in glob.glob(folder + "/*")]
            entry = {"program": test.program, "built": built, "name": test.name, "passed": passed}
            entry |= {"seconds": seconds, "reached": sorted({int(number) for file in files for number in file})}
            with store.open("a") as log:
                log.write(json.dumps(entry) + "\n")
        test.seconds, test.reached = entry["seconds"], frozenset(entry["reached"])
        return entry["passed"]

    with concurrent.futures.ThreadPoolExecutor(JOBS) as pool:
        passed = list(pool.map(record, tests))
    failing = [test.name for test, ok in zip(tests, passed) if not ok]
    if failing:
        print(f"left out, since they fail as things are or take long: {', '.join(failing)}", file=sys.stderr)
    return [test for test, ok in zip(tests, passed) if ok]


def outcome(number: int, path: str, tests: list[Test], longest: float) -> tuple[str, str]:
    """What became of a mutant, and the program that noticed it."""
    mirrored = "tests/" + os.path.dirname(path).removeprefix("image_processing/")
    by_program = collections.defaultdict(list)
    for test in tests:
        by_program[test.program].append(test)

    def order(program: str) -> tuple:
        near = os.path.commonprefix([os.path.dirname(program), mirrored]).count("/")
        return (-near, sum(test.seconds for test in by_program[program]))

    left = longest
    for program in sorted(by_program, key=order):
        some = []
        for test in sorted(by_program[program], key=lambda test: test.seconds):
            if some and test.seconds > left:
                break
            some.append(test)
            left -= test.seconds
        seconds = sum(test.seconds for test in some)
        passed, _ = run(program, [test.name for test in some], 4 * seconds + 3, QUENBY_MUTANT=str(number))
        if not passed:
            return "killed", program
        if left <= 0:
            break
    return "survived", ""


def known_reasons() -> list[tuple[str, str]]:
    reasons = []
    for line in (ROOT / "tools/mutants/survivors.txt").read_text().splitlines():
        if line and not line.startswith("#"):
            pattern, reason = line.rsplit(" | ", 1)
            # Only * is special: lines are full of brackets.
            reasons.append((re.sub(r"[\[?]", lambda sign: f"[{sign[0]}]", pattern), reason))
    return reasons


def show(mutants: list[Mutant], results: dict[str, str]) -> None:
    reasons = known_reasons()
    rows = collections.defaultdict(collections.Counter)
    for mutant in mutants:
        result = results.get(mutant.key)
        if result is None:
            continue
        shown = " | ".join([mutant.path, mutant.before, mutant.after])
        if result == "survived" and any(fnmatch.fnmatchcase(shown, pattern) for pattern, _ in reasons):
            result = "with a reason"
        if result == "survived":
            print(f"{mutant.path}:{mutant.line} {mutant.edit.kind}\n  - {mutant.before}\n  + {mutant.after}")
        rows[os.path.dirname(mutant.path)][result] += 1
    print("| Folder | " + " | ".join(KINDS) + " |")
    print("|---" * (len(KINDS) + 1) + "|")
    total = collections.Counter()
    for folder, counts in sorted(rows.items()):
        print(f"| `{folder}` | " + " | ".join(str(counts[kind]) for kind in KINDS) + " |")
        total.update(counts)
    print("| all | " + " | ".join(str(total[kind]) for kind in KINDS) + " |")
    if tried := sum(total.values()):
        print(f"\n{tried} mutants, {100 * total['killed'] / tried:.1f} % of them killed")


def main() -> None:
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawTextHelpFormatter)
    parser.add_argument("paths", nargs="*", default=FOLDERS, help="files and folders (engine, photo and jni)")
    parser.add_argument("--count", type=int, default=1000, help="how many, with those known already (1000)")
    parser.add_argument("--seconds", type=float, default=float("inf"), help="when to stop")
    parser.add_argument("--longest", type=float, default=15, help="seconds of CPU time of tests a mutant (15)")
    parser.add_argument("--seed", type=int, default=1, help="of the choice")
    parser.add_argument("--again", action="store_true", help="try those again that survived")
    parser.add_argument("--show", action="store_true", help="only tell what is known")
    arguments = parser.parse_args()
    end = time.monotonic() + arguments.seconds

    WORK.mkdir(parents=True, exist_ok=True)
    store = WORK / "results.jsonl"
    lines = store.read_text().splitlines() if store.exists() else []
    results = {entry["key"]: entry["result"] for entry in map(json.loads, lines)}
    tree = read_tree()
    mutants = numbered(all_mutants(tree))
    prefixes = tuple(arguments.paths)
    chosen = [number for number, mutant in mutants.items() if mutant.path.startswith(prefixes)]
    if arguments.show:
        show([mutants[number] for number in chosen], results)
        return

    programs = Programs(tree, mutants)
    programs.build()
    tests = find_tests(programs.programs, arguments.longest)
    reaching = collections.defaultdict(list)
    for test in tests:
        for number in test.reached:
            reaching[number].append(test)
    print(f"{len(mutants)} edits, {len(programs.refused)} of them do not compile, tests reach {len(reaching)}", flush=True)

    chosen = [number for number in chosen if number in reaching]
    random.Random(arguments.seed).shuffle(chosen)
    known = [number for number in chosen if mutants[number].key in results]
    if arguments.again:
        todo = [number for number in known if results[mutants[number].key] == "survived"]
    else:
        todo = [number for number in chosen if mutants[number].key not in results]
        if arguments.count:
            todo = todo[: max(0, arguments.count - len(known))]

    def attempt(number: int) -> None:
        if time.monotonic() > end:
            return
        mutant = mutants[number]
        result, by = outcome(number, mutant.path, reaching[number], arguments.longest)
        results[mutant.key] = result
        with store.open("a") as log:
            log.write(json.dumps({"key": mutant.key, "result": result, "by": by}) + "\n")

    with concurrent.futures.ThreadPoolExecutor(JOBS) as pool:
        for _ in pool.map(attempt, todo):
            pass
    show([mutants[number] for number in chosen], results)


if __name__ == "__main__":
    main()

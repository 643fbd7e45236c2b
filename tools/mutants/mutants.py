#!/usr/bin/env python3
"""Changes one line of the library at a time and looks whether a test fails: what survives is what no test
asks. The tree stays as it is; the changed file is compiled beside it and linked before the libraries.

    tools/mutants/mutants.py image_processing/core photo/files.cpp      # every mutant of these
    tools/mutants/mutants.py --seconds 600 --seed 2 photo               # as many as time allows, any
    tools/mutants/mutants.py --again photo                              # those that survived, once more

Needs a build with the tests (./quenby test release, or targets of it): programs that are not built are
left out, and said so. What was found stays in build/mutants/results.jsonl, so that the next run goes on.
survivors.txt has those that survive for a reason: a line of tools/mutants/survivors.txt is the path, the
line as it was, as it is changed, and why that is no fault, parted by " | ".
"""

import argparse
import collections
import hashlib
import json
import os
import pathlib
import random
import resource
import shlex
import shutil
import subprocess
import sys
import tempfile
import time

import edits

ROOT = pathlib.Path(__file__).resolve().parents[2]
KNOWN = ROOT / "tools/mutants/survivors.txt"
MEMORY = 4 << 30  # of a test: a mutant may want any


def limited() -> None:
    resource.setrlimit(resource.RLIMIT_AS, (MEMORY, MEMORY))
    resource.setrlimit(resource.RLIMIT_CORE, (0, 0))
    resource.setrlimit(resource.RLIMIT_FSIZE, (1 << 28, 1 << 28))


class Build:
    """What a build folder knows: how a file is compiled and a program linked."""

    def __init__(self, folder: pathlib.Path, scratch: pathlib.Path, longest: float) -> None:
        self.folder, self.scratch, self.longest = folder, scratch, longest
        self.compiles = {}
        for entry in json.loads((folder / "compile_commands.json").read_text()):
            source = os.path.relpath(os.path.join(entry["directory"], entry["file"]), ROOT)
            words = shlex.split(entry["command"])
            self.compiles.setdefault(source, []).append(words)
        listed = self._ninja("-t", "targets", "all")
        names = [line.split(": ")[0] for line in listed.splitlines() if "EXECUTABLE_LINKER" in line]
        programs = [name for name in names if name.startswith("tests/") and name.endswith(("_test", "_tests"))]
        self.programs = [name for name in programs if (folder / name).exists()]
        self.missing = len(programs) - len(self.programs)
        self._inputs, self._seconds, self._links, self._readers = {}, {}, {}, None

    def _ninja(self, *arguments: str) -> str:
        command = ["ninja", "-C", str(self.folder), *arguments]
        return subprocess.run(command, check=True, capture_output=True, text=True).stdout

    def inputs(self, program: str) -> set[str]:
        if program not in self._inputs:
            self._inputs[program] = set(self._ninja("-t", "inputs", program).splitlines())
        return self._inputs[program]

    def object_of(self, words: list[str]) -> str:
        return words[words.index("-o") + 1]

    def compile(self, words: list[str], source: pathlib.Path, overlay: pathlib.Path = None) -> pathlib.Path:
        """The object of another source in place of the command's; None where it does not compile."""
        made = self.scratch / "mutant.o"
        words = [word for word in words if word not in ("ccache",) and not word.endswith("/ccache")]
        words = ["-O1" if word in ("-O2", "-O3") else word for word in words]
        words[words.index("-o") + 1] = str(made)
        words[words.index("-c") + 1] = str(source)
        # Kernels for one instruction set: the others are the same lines.
        words[1:1] = (["-I", str(overlay)] if overlay else []) + ["-w", "-DHWY_COMPILE_ONLY_STATIC"]
        try:
            done = subprocess.run(words, cwd=self.folder, capture_output=True, timeout=180)
        except subprocess.TimeoutExpired:
            return None
        return made if done.returncode == 0 else None

    def link(self, program: str, place: str, made: pathlib.Path) -> pathlib.Path:
        """The program with an object in place of its own at `place`, or before its libraries."""
        if program not in self._links:
            commands = self._ninja("-t", "commands", "-s", program).strip().splitlines()[-1]
            command = commands.split(" && ")
            self._links[program] = shlex.split(max(command, key=len))
        words = list(self._links[program])
        if place in words:
            words[words.index(place)] = str(made)
        else:
            first = next(i for i, word in enumerate(words) if word.endswith(".a"))
            words.insert(first, str(made))
        out = self.scratch / "program"
        words[words.index("-o") + 1] = str(out)
        done = subprocess.run(words, cwd=self.folder, capture_output=True)
        return out if done.returncode == 0 else None

    def run(self, program: pathlib.Path, seconds: float) -> bool:
        """Whether all its tests pass."""
        folder = self.scratch / "files"
        shutil.rmtree(folder, ignore_errors=True)
        folder.mkdir()
        environment = {**os.environ, "TMPDIR": str(folder), "GTEST_FAIL_FAST": "1", "GTEST_BRIEF": "1"}
        process = subprocess.Popen(
            [str(program)],
            cwd=folder,
            env=environment,
            stdin=subprocess.DEVNULL,
            stdout=subprocess.DEVNULL,
            stderr=subprocess.DEVNULL,
            preexec_fn=limited,
            start_new_session=True,
        )
        try:
            return process.wait(seconds) == 0
        except subprocess.TimeoutExpired:
            os.killpg(process.pid, 9)
            process.wait()
            return False

    def seconds(self, program: str) -> float:
        """How long it takes as it is; more than it may where it fails."""
        if program not in self._seconds:
            start = time.monotonic()
            passes = self.run(self.folder / program, self.longest)
            self._seconds[program] = time.monotonic() - start if passes else 2 * self.longest
        return self._seconds[program]

    def readers(self) -> dict[str, dict[str, str]]:
        """Of each header the programs whose own files read it, with the object of the first such file."""
        if self._readers is None:
            self._readers = collections.defaultdict(dict)
            program_of = {os.path.basename(program): program for program in self.programs}
            prefix = os.path.relpath(ROOT, self.folder) + "/"
            program = target = None
            for line in self._ninja("-t", "deps").splitlines():
                if ": #deps" in line:
                    target = line.split(": #deps")[0]
                    folder = next((word for word in target.split("/") if word.endswith(".dir")), "")
                    program = program_of.get(folder.removesuffix(".dir"))
                elif program:
                    header = line.strip().removeprefix(prefix).removeprefix(str(ROOT) + "/")
                    self._readers[header].setdefault(program, target)
        return self._readers

    def tests_of(self, source: str, place: str) -> list[str]:
        """Programs that hold an object or header, those whose name or folder is the source's first."""
        stem = pathlib.Path(source).stem.replace("_simd", "").replace("_tables", "")
        mirrored = "tests/" + os.path.dirname(source).removeprefix("image_processing/")

        def distance(program: str) -> tuple:
            folder, name = os.path.split(program)
            return (not name.startswith(stem), folder != mirrored, self._seconds.get(program, 0), name)

        return sorted((program for program in self.programs if place in self.inputs(program)), key=distance)


class Mutant:
    def __init__(self, path: str, edit: edits.Edit, nth: int) -> None:
        self.path, self.edit = path, edit
        key = "\0".join([path, edit.before.strip(), edit.after.strip(), str(nth)])
        self.key = hashlib.sha256(key.encode()).hexdigest()[:16]

    def shown(self) -> str:
        return f"{self.path} | {self.edit.before.strip()} | {self.edit.after.strip() or ';'}"


def mutants_of(path: str) -> list[Mutant]:
    seen = collections.Counter()
    made = []
    for edit in edits.edits((ROOT / path).read_text()):
        place = (edit.before.strip(), edit.after.strip())
        made.append(Mutant(path, edit, seen[place]))
        seen[place] += 1
    return made


def outcome(build: Build, mutant: Mutant, original: dict) -> str:
    lines = (ROOT / mutant.path).read_text().split("\n")
    lines[mutant.edit.line] = mutant.edit.after
    changed = build.scratch / "overlay" / mutant.path
    shutil.rmtree(build.scratch / "overlay", ignore_errors=True)
    changed.parent.mkdir(parents=True)
    changed.write_text("\n".join(lines))
    if mutant.path.endswith(".h"):
        return header_outcome(build, mutant)
    words = build.compiles[mutant.path][0]
    place = build.object_of(words)
    if mutant.path not in original:
        # Compiled from the same place: so that names of files in the object are the same.
        changed.write_text((ROOT / mutant.path).read_text())
        made = build.compile(words, changed)
        if made is None:
            raise SystemExit(f"{mutant.path} does not compile as it is")
        original[mutant.path] = made.read_bytes()
        changed.write_text("\n".join(lines))
    made = build.compile(words, changed)
    if made is None:
        return "not built"
    if made.read_bytes() == original[mutant.path]:
        return "same code"
    linked = False
    for program in build.tests_of(mutant.path, place):
        usual = build.seconds(program)
        if usual > build.longest:
            continue
        out = build.link(program, place, made)
        if out is None:  # which has the file through a shared library
            continue
        linked = True
        if not build.run(out, 4 * usual + 3):
            return "killed"
    return "survived" if linked else "no test"


def header_outcome(build: Build, mutant: Mutant) -> str:
    users = build.readers()[mutant.path]
    stem = pathlib.Path(mutant.path).stem
    ordered = sorted(users, key=lambda name: (not os.path.basename(name).startswith(stem), name))
    built = False
    for program in ordered[:4]:
        usual = build.seconds(program)
        if usual > build.longest:
            continue
        source, words = next(
            (source, words)
            for source, all_words in build.compiles.items()
            for words in all_words
            if build.object_of(words) == users[program]
        )
        made = build.compile(words, ROOT / source, build.scratch / "overlay")
        if made is None:
            return "not built"
        out = build.link(program, users[program], made)
        if out is None:
            return "not built"
        built = True
        if not build.run(out, 4 * usual + 3):
            return "killed"
    return "survived" if built else "no test"


def sources(paths: list[str]) -> list[str]:
    found = []
    for path in paths:
        whole = ROOT / path
        files = [whole] if whole.is_file() else sorted([*whole.rglob("*.cpp"), *whole.rglob("*.h")])
        found += [os.path.relpath(file, ROOT) for file in files]
    return found


def known_reasons() -> dict[str, str]:
    reasons = {}
    for line in KNOWN.read_text().splitlines() if KNOWN.exists() else []:
        if line and not line.startswith("#"):
            mutant, reason = line.rsplit(" | ", 1)
            reasons[mutant] = reason
    return reasons


def table(mutants: list[Mutant], results: dict[str, str], reasons: dict[str, str]) -> None:
    rows = collections.defaultdict(collections.Counter)
    for mutant in mutants:
        result = results.get(mutant.key)
        if result is None:
            continue
        if result in ("survived", "no test") and mutant.shown() in reasons:
            result = "with a reason"
        rows[os.path.dirname(mutant.path)][result] += 1
    kinds = ["killed", "survived", "with a reason", "no test", "same code", "not built"]
    print("| Folder | " + " | ".join(kinds) + " |")
    print("|---" * (len(kinds) + 1) + "|")
    total = collections.Counter()
    for folder, counts in sorted(rows.items()):
        print(f"| `{folder}` | " + " | ".join(str(counts[kind]) for kind in kinds) + " |")
        total.update(counts)
    print("| all | " + " | ".join(str(total[kind]) for kind in kinds) + " |")
    tried = total["killed"] + total["survived"] + total["no test"] + total["with a reason"]
    if tried:
        print(f"\n{tried} mutants, {100 * total['killed'] / tried:.1f} % of them killed")


def main() -> None:
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawTextHelpFormatter)
    parser.add_argument("paths", nargs="+", help="files and folders of the tree")
    parser.add_argument("--build", default="build/release", help="the build to take (build/release)")
    parser.add_argument("--seconds", type=float, default=float("inf"), help="when to stop")
    parser.add_argument("--seed", type=int, help="in an order of its own; else from top to bottom")
    parser.add_argument("--longest", type=float, default=5, help="seconds; longer tests are left out (5)")
    parser.add_argument("--again", action="store_true", help="try those again that survived")
    parser.add_argument("--show", action="store_true", help="only tell what is known")
    arguments = parser.parse_args()

    store = ROOT / "build/mutants/results.jsonl"
    store.parent.mkdir(parents=True, exist_ok=True)
    results = {}
    if store.exists():
        for line in store.read_text().splitlines():
            entry = json.loads(line)
            results[entry["key"]] = entry["result"]
    mutants = [mutant for path in sources(arguments.paths) for mutant in mutants_of(path)]
    reasons = known_reasons()
    survivors = lambda mutant: results.get(mutant.key) in ("survived", "no test")
    if arguments.again:
        todo = [mutant for mutant in mutants if survivors(mutant)]
    else:
        todo = [mutant for mutant in mutants if mutant.key not in results]
    if arguments.seed is not None:
        random.Random(arguments.seed).shuffle(todo)
    if arguments.show:
        todo = []

    end = time.monotonic() + arguments.seconds
    with tempfile.TemporaryDirectory(prefix="mutants-") as scratch, store.open("a") as log:
        build = Build(ROOT / arguments.build, pathlib.Path(scratch), arguments.longest)
        if build.missing and todo:
            print(f"{build.missing} test programs are not built and left out", file=sys.stderr)
        original = {}
        for number, mutant in enumerate(todo):
            if time.monotonic() > end:
                print(f"{len(todo) - number} mutants are left", file=sys.stderr)
                break
            if not mutant.path.endswith(".h") and mutant.path not in build.compiles:
                continue
            result = outcome(build, mutant, original)
            results[mutant.key] = result
            log.write(json.dumps({"key": mutant.key, "result": result, "mutant": mutant.shown()}) + "\n")
            log.flush()
    for mutant in mutants:
        if survivors(mutant) and mutant.shown() not in reasons:
            print(f"{results[mutant.key]}: {mutant.path}:{mutant.edit.line + 1}")
            print(f"  - {mutant.edit.before.strip()}\n  + {mutant.edit.after.strip() or ';'}")
    table(mutants, results, reasons)


if __name__ == "__main__":
    main()

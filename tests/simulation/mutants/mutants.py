#!/usr/bin/env python3
"""Which of the faults in mutants.txt the simulator finds by itself.

Each fault is made in a copy of the sources below build/mutants, built and simulated; what fails finds it. The table
goes to standard output as it stands in docs/testing.md.

usage: mutants.py [PATTERN]     only those whose file or line contains the pattern, or of these numbers: 3,17
"""
import os
import re
import shutil
import subprocess
import sys
import time
from pathlib import Path

ROOT = Path(__file__).resolve().parents[3]
WORK = ROOT / "build" / "mutants"
SOURCE = WORK / "source"
BUILD = WORK / "build"
SIMULATE = BUILD / "tests" / "simulation" / "callcontrol-simulate"
SECONDS = int(os.environ.get("MUTANT_SECONDS", "60"))


def read_mutants(path):
    mutants, fault = [], {}
    for line in path.read_text().splitlines() + [""]:
        key, _, text = line.partition(" ")
        if key in ("file", "old", "new"):
            fault[key] = text
        if not line.strip() and fault:
            fault.setdefault("new", "")
            mutants.append(fault)
            fault = {}
    return mutants


def run(command, **options):
    return subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True, **options)


def build(target="callcontrol"):
    return run(["cmake", "--build", str(BUILD), "-j", os.environ.get("JOBS", str(os.cpu_count())), "--target", target])


def prepare():
    shutil.rmtree(SOURCE, ignore_errors=True)
    for name in run(["git", "ls-files"], cwd=ROOT, check=True).stdout.splitlines():
        if (ROOT / name).is_file():
            (SOURCE / name).parent.mkdir(parents=True, exist_ok=True)
            shutil.copy(ROOT / name, SOURCE / name) # younger than what was built before
    # not "Release": no optimisation beyond a file, so that one file is compiled for each fault
    run(["cmake", "-S", str(SOURCE), "-B", str(BUILD), "-G", "Ninja", "-DCMAKE_BUILD_TYPE=Mutants",
         "-DCMAKE_CXX_FLAGS=-O1 -DNDEBUG -w", "-DCALLCONTROL_BUILD_TESTS=ON",
         "-DCMAKE_CXX_COMPILER_LAUNCHER=" + (shutil.which("ccache") or "")], check=True)
    result = build("callcontrol-simulate")
    if result.returncode != 0:
        sys.exit(result.stdout[-2000:])


def split_place(old):
    text, at, number = old.rpartition("@")
    return (text, int(number)) if at and number.isdigit() else (old, 1)


def make_fault(fault):
    """The file with the fault, or None where the line does not occur (any more)."""
    wanted, place = split_place(fault["old"])
    lines = (ROOT / fault["file"]).read_text().splitlines()
    found = [i for i, line in enumerate(lines) if line.strip() == wanted]
    if len(found) < place:
        return None
    lines[found[place - 1]] = fault["new"]
    return "\n".join(lines) + "\n"


def simulate():
    begin = time.monotonic()
    try:
        result = run([str(SIMULATE), "--seed", "1", "--seconds", str(SECONDS), "--no-shrink", "--output",
                      str(WORK / "failure.txt")], timeout=SECONDS + 60)
    except subprocess.TimeoutExpired:
        return "it hangs", time.monotonic() - begin
    failures = [line[8:] for line in result.stdout.splitlines() if line.startswith("FAILED: ")]
    if result.returncode != 0 and not failures:
        failures = ["it crashes before the first run"]
    return (failures[0] if failures else None), time.monotonic() - begin


def shorten(text, length):
    text = re.sub(r"&(\w+;)", r"& \1", text.replace("|", "\\|")) # which is no character's name
    return text if len(text) <= length else text[: length - 3] + "..."


def try_fault(number, fault):
    text = make_fault(fault)
    if text is None:
        return "the line is not there", 0
    path = SOURCE / fault["file"]
    path.write_text(text)
    try:
        if build().returncode != 0:
            return "does not compile", 0
        return simulate()
    finally:
        path.write_text((ROOT / fault["file"]).read_text())


def main():
    pattern = sys.argv[1] if len(sys.argv) > 1 else ""
    numbers = [int(number) for number in pattern.split(",") if number] if pattern[:1].isdigit() else []
    mutants = read_mutants(Path(__file__).with_name("mutants.txt"))
    prepare()
    found = tried = 0
    print("| | File | Line | Instead | Found by | after |\n|---|---|---|---|---|---|", flush=True)
    for number, fault in enumerate(mutants, 1):
        if number not in numbers if numbers else pattern not in fault["file"] + fault["old"]:
            continue
        how, seconds = try_fault(number, fault)
        tried += 1
        found += how is not None and seconds > 0
        print(f"| {number} | {Path(fault['file']).name} | `{shorten(fault['old'], 80)}` | "
              f"`{shorten(fault['new'], 60) or ' '}` | {shorten(how or '**not found**', 70)} | {seconds:.1f} s |",
              flush=True)
    print(f"\n{found} of {tried} found", flush=True)


main()

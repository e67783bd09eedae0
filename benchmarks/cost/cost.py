#!/usr/bin/env python3
"""cost.py RELEASE_BUILD ARM_BUILD BUDGET [--update]

Counts what each step of a call costs with 1, 100, 10,000 and 100,000 calls up: instructions (callgrind here, a plugin of
qemu on 32-bit Arm), allocations and their octets; and the octets that a call which is up holds. Prints the table and
compares it with the budget: more than 2 % above fails, more than 2 % below asks for the budget to be lowered.
"""
import json
import os
import re
import subprocess
import sys
import tempfile

CALLS = {"x86_64": [1, 100, 10000, 100000], "arm": [1, 100, 10000]}
TOLERANCE = 0.02
FLOOR_RATIO = 2.6  # a whole call may cost as many times the instructions of the memory work that it cannot avoid
RECORDED_FLOOR_RATIO = {"x86_64": 3.03, "arm": 3.05}  # and one that is recorded: a tenth more than a call cost before calls could be recorded
RECORDED_RATIO = {"x86_64": 1.14, "arm": 1.18}  # a call that is recorded may cost as many times the instructions of one that is not
RESIDENT_LIMIT = 8192  # octets of a call that is up, both adapters included
GROWTH_LIMIT = 1.5  # of what a step costs with the most calls up, against a hundred
PROGRAM = "benchmarks/cost/call_cost"
ENVIRONMENT = {"LD_BIND_NOW": "1", "PATH": os.environ["PATH"]}  # what the dynamic linker does late would count


def run(command, **options):
    done = subprocess.run(command, env=ENVIRONMENT, capture_output=True, text=True, **options)
    if done.returncode != 0:
        sys.exit(f"{' '.join(command)} ended with {done.returncode}:\n{done.stderr}")
    return done


def own_figures(output):
    """What the program prints of itself: step -> {figure: number}."""
    figures = {}
    for line in output.splitlines():
        name, *numbers = line.split("\t")
        if len(numbers) == 2:
            figures[name] = {"allocations": int(numbers[0]), "octets": int(numbers[1])}
        else:
            figures[name] = {"number": int(numbers[0])}
    return figures


def callgrind(build, calls):
    with tempfile.TemporaryDirectory() as folder:
        out = f"{folder}/callgrind.out"
        done = run(["valgrind", "--tool=callgrind", "--instr-atstart=no", "--combine-dumps=yes",
                    f"--callgrind-out-file={out}", f"{build}/{PROGRAM}", str(calls)])
        with open(out, encoding="utf-8") as dump:
            parts = re.findall(r"^desc: Trigger: Client Request: (.*)\n(?:.*\n)*?totals: (\d+)", dump.read(), re.M)
    return own_figures(done.stdout), parts


def qemu(build, calls):
    done = run(["qemu-arm", "-E", "LD_BIND_NOW=1", "-L", "/usr/arm-linux-gnueabihf", "-plugin",
                f"{build}/benchmarks/cost/arm/count_instructions.so", f"{build}/{PROGRAM}", str(calls)])
    return own_figures(done.stdout), [line.rsplit(" ", 1) for line in done.stderr.splitlines()]


def measure(count, build, calls):
    """Figures of each step; a mark's own instructions, those of the step in which nothing happens, are taken off."""
    figures, parts = count(build, calls)
    for name, instructions in parts:
        if name in figures:
            step = figures[name]
            step["instructions"] = step.get("instructions", 0) + int(instructions)
            step["marks"] = step.get("marks", 0) + 1
    of_a_mark = figures.pop("nothing")["instructions"]
    for step in figures.values():
        if "marks" in step:
            step["instructions"] -= step.pop("marks") * of_a_mark
        elif "allocations" in step:
            sys.exit("a step without instructions: nothing was counted")
    return figures


def table(measured):
    for machine, by_calls in measured.items():
        columns = list(by_calls)
        print(f"\n{machine}: instructions with so many calls up; allocations and octets with the first number")
        print(f"  {'':36}" + "".join(f"{int(calls):>12,}" for calls in columns) + f"{'allocations':>13}{'octets':>9}")
        for step, first in by_calls[columns[0]].items():
            if "instructions" in first:
                row = "".join(f"{by_calls[calls][step]['instructions']:>12,}" for calls in columns)
                print(f"  {step:36}{row}{first['allocations']:>13,}{first['octets']:>9,}")
            else:
                print(f"  {step:36}" + "".join(f"{by_calls[calls][step]['number']:>12,}" for calls in columns))


def targets(measured):
    """What must hold whatever the budget says."""
    complaints = []
    for machine, by_calls in measured.items():
        for calls, steps in by_calls.items():
            ratio = steps["whole call"]["instructions"] / steps["floor"]["instructions"]
            if calls == "1":
                print(f"\n{machine}: a whole call costs {ratio:.2f} times the instructions of its floor")
            if ratio > FLOOR_RATIO and machine == "x86_64":
                complaints.append(f"{machine}, {calls} calls: a whole call costs {ratio:.2f} floors, not {FLOOR_RATIO}")
            ratio = steps["whole call, recorded"]["instructions"] / steps["floor"]["instructions"]
            if ratio > RECORDED_FLOOR_RATIO[machine]:
                complaints.append(f"{machine}, {calls} calls: a recorded call costs {ratio:.2f} floors")
            recorded = steps["whole call, recorded"]["instructions"] / steps["whole call"]["instructions"]
            if recorded > RECORDED_RATIO[machine]:
                complaints.append(f"{machine}, {calls} calls: recording costs {recorded:.2f} times the call")
            if calls != "1" and steps["resident octets"]["number"] > RESIDENT_LIMIT:
                complaints.append(f"{machine}, {calls} calls: {steps['resident octets']['number']} octets for each")
        most = list(by_calls)[-1]
        for step, few in by_calls["100"].items():
            many = by_calls[most][step]
            if "instructions" in few and many["instructions"] > GROWTH_LIMIT * few["instructions"]:
                complaints.append(f"{machine}: '{step}' grows from {few['instructions']} to {many['instructions']}")
    return complaints


def compare(measured, budget):
    above, below = [], []
    for machine, by_calls in measured.items():
        for calls, steps in by_calls.items():
            for step, figures in steps.items():
                for figure, number in figures.items():
                    allowed = budget.get(machine, {}).get(calls, {}).get(step, {}).get(figure)
                    what = f"{machine}, {calls} calls: {figure} of '{step}' is {number}, the budget {allowed}"
                    if allowed is None or number > allowed * (1 + TOLERANCE):
                        above.append(what)
                    elif number < allowed * (1 - TOLERANCE):
                        below.append(what)
    return above, below


def main():
    release, arm, budget_file, *options = sys.argv[1:]
    if options not in ([], ["--update"]):
        sys.exit(__doc__)
    counted = {"x86_64": (callgrind, release), "arm": (qemu, arm)}
    measured = {machine: {str(calls): measure(count, build, calls) for calls in CALLS[machine]}
                for machine, (count, build) in counted.items()}
    table(measured)
    complaints = targets(measured)
    if options:
        with open(budget_file, "w", encoding="utf-8") as file:
            json.dump(measured, file, indent=1)
            file.write("\n")
        print(f"\nwritten to {budget_file}")
    with open(budget_file, encoding="utf-8") as file:
        above, below = compare(measured, json.load(file))
    for line in below:
        print(f"lower the budget: {line}")
    for line in above + complaints:
        print(f"over: {line}")
    print(f"\n{len(above) + len(complaints)} over, {len(below)} to be lowered")
    sys.exit(1 if above or complaints else 0)


main()

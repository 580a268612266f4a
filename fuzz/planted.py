#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Puts faults into the readers, one at a time, and sees whether the fuzz targets find them.

    planted.py SOURCE SECONDS [TARGET...]

SOURCE is a clone of the project with the build `build/linux-fuzz`. The faults are in plantedFaults.txt.
Each must be found within SECONDS. Ends with 1 if one is not.
"""
import pathlib
import subprocess
import sys
import tempfile
import time
from typing import NamedTuple


class Fault(NamedTuple):
    target: str
    file: str
    line: str
    faulty: str


def planted(file: pathlib.Path) -> list[Fault]:
    lines = [line for line in file.read_text(encoding="utf-8").splitlines()
             if line and not line.startswith("#")]
    return [Fault(*place.split(" "), line.removeprefix("- "), faulty.removeprefix("+ "))
            for place, line, faulty in zip(lines[::3], lines[1::3], lines[2::3], strict=True)]


def put_into(text: str, fault: Fault) -> str:
    """Returns the text with the fault in the only line that is the one of the fault."""
    lines = text.splitlines(keepends=True)
    places = [index for index, line in enumerate(lines) if line.strip() == fault.line]
    if len(places) != 1:
        sys.exit(f"{fault.file} has {len(places)} lines: {fault.line}")
    lines[places[0]] = lines[places[0]].replace(fault.line, fault.faulty)
    return "".join(lines)


def program_of(build: pathlib.Path, target: str) -> pathlib.Path:
    name = "fuzz" + target[0].upper() + target[1:]
    for folder in ("bin", "internals"):
        if (build / folder / name).exists():
            return build / folder / name
    sys.exit(f"there is no target {target}")


def ends(source: pathlib.Path, target: str, limit: str) -> bool:
    """Runs the target from the stored inputs, and returns whether one of the inputs ends it."""
    with tempfile.TemporaryDirectory() as found:
        command = [str(program_of(source / "build/linux-fuzz", target)),
                   limit, "-max_len=4096", "-timeout=20", "-rss_limit_mb=2500",
                   "-malloc_limit_mb=1000", f"-artifact_prefix={found}/end-"]
        dictionary = source / f"fuzz/dictionaries/{target}.dict"
        if dictionary.exists():
            command.append(f"-dict={dictionary}")
        (pathlib.Path(found) / "inputs").mkdir()
        command += [f"{found}/inputs", str(source / "fuzz/corpus" / target)]
        ended = subprocess.run(command, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
                               stdin=subprocess.DEVNULL, check=False)
        return ended.returncode != 0


def outcome(source: pathlib.Path, fault: Fault, seconds: int) -> str:
    file = source / fault.file
    original = file.read_text(encoding="utf-8")
    try:
        file.write_text(put_into(original, fault), encoding="utf-8")
        program = program_of(source / "build/linux-fuzz", fault.target).name
        built = subprocess.run(["ninja", program], cwd=source / "build/linux-fuzz", text=True,
                               stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
        if built.returncode:
            sys.exit(built.stdout)
        begin = time.monotonic()
        if not ends(source, fault.target, f"-max_total_time={seconds}"):
            return "not found"
        return f"found in {time.monotonic() - begin:.0f} s"
    finally:
        file.write_text(original, encoding="utf-8")


def main() -> int:
    source, seconds, targets = pathlib.Path(sys.argv[1]), int(sys.argv[2]), sys.argv[3:]
    missed = 0
    faults = [fault for fault in planted(pathlib.Path(__file__).with_name("plantedFaults.txt"))
              if not targets or fault.target in targets]
    for target in sorted({fault.target for fault in faults}):
        if ends(source, target, "-runs=0"):
            sys.exit(f"{target}: a stored input ends it without a fault")
    for fault in faults:
        told = outcome(source, fault, seconds)
        missed += told == "not found"
        print(f"{fault.target}: {told}: {fault.file}: {fault.faulty}", flush=True)
    return 1 if missed else 0


if __name__ == "__main__":
    sys.exit(main())

#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Reports for how many conditions the tests show that each decides alone (MC/DC).

    mcdc.py SOURCE BUILD PROFILES OUTPUT

PROFILES contains what the instrumented programs of BUILD wrote when they ended; one that is killed
writes nothing. OUTPUT gets the pages that show each decision.
"""
import collections
import json
import pathlib
import subprocess
import sys

TOOLS = "19"  # of LLVM, the version of the compiler in the preset


def tool(name: str, *arguments: object, **options: object) -> subprocess.CompletedProcess[str]:
    return subprocess.run([f"{name}-{TOOLS}", *map(str, arguments)], check=True, text=True,
                          **options)  # type: ignore[call-overload]


def programs(build: pathlib.Path) -> list[pathlib.Path]:
    """Returns the libraries, and the test programs, which contain what only headers have."""
    found = [*build.glob("lib/libMZ*.so"), *build.glob("lib/mzcomponents-probe"),
             *build.glob("bin/*Tests"), *build.glob("internals/*Tests")]
    return sorted(file for file in found if file.is_file())


def main() -> int:
    source, build, profiles, output = (pathlib.Path(part).resolve() for part in sys.argv[1:5])
    output.mkdir(parents=True, exist_ok=True)
    merged = output / "merged.profdata"
    listed = output / "profiles.txt"
    listed.write_text("\n".join(map(str, sorted(profiles.glob("*.profraw")))))
    tool("llvm-profdata", "merge", "-sparse", "-f", listed, "-o", merged)
    first, *others = programs(build)
    measured = [first, *(f"-object={file}" for file in others), f"-instr-profile={merged}",
                "-ignore-filename-regex=/tests/"]
    summary = tool("llvm-cov", "export", "-summary-only", *measured, stdout=subprocess.PIPE).stdout
    tool("llvm-cov", "show", "--show-mcdc", "--format=html", f"-output-dir={output}", *measured,
         stdout=subprocess.DEVNULL)
    count: collections.Counter[str] = collections.Counter()
    covered: collections.Counter[str] = collections.Counter()
    for file in json.loads(summary)["data"][0]["files"]:
        path = pathlib.Path(file["filename"])
        if path.is_relative_to(source / "components"):
            for name in (path.relative_to(source).parts[1], "components"):
                count[name] += file["summary"]["mcdc"]["count"]
                covered[name] += file["summary"]["mcdc"]["covered"]
    for name in sorted(count, key=lambda library: (library == "components", library)):
        print(f"    {name:17} {covered[name]:5} of {count[name]:5} conditions,"
              f" {100 * covered[name] / max(count[name], 1):6.2f} %")
    print(f"    each decision: {output / 'index.html'}")
    return 0


if __name__ == "__main__":
    sys.exit(main())

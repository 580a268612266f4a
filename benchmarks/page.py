#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Writes the figures of a run into the page of the figures, and draws them.

  page.py FIGURES PAGE PICTURE [MISSING…]

FIGURES is what `--ratios_out` wrote, from a run of all benchmarks with their peers, on this machine.
PAGE is a Markdown file with the two comments between which the tables are, PICTURE the SVG file to write.
MISSING are the packages of peers that could not be installed.
"""
import html
import json
import math
import os
import platform
import re
import shutil
import subprocess
import sys
from pathlib import Path

BEGIN = "<!-- The figures begin here; ./run bench --peers writes them. -->"
END = "<!-- The figures end here. -->"

# The packages whose versions tell which peers were measured.
PACKAGES = {"fmt": "libfmt-dev", "fast_float": "libfast-float-dev", "cereal": "libcereal-dev",
            "Boost": "libboost-serialization-dev", "tinyobjloader": "libtinyobjloader-dev",
            "assimp": "libassimp-dev", "Qt": "qt6-base-dev", "POCO": "libpoco-dev",
            "GStreamer": "libgstreamer1.0-dev", "libstdc++": "libstdc++-12-dev", "glibc": "libc6-dev"}


def time_text(nanoseconds: float) -> str:
    for limit, unit, divisor in [(1e3, "ns", 1), (1e6, "µs", 1e3), (1e9, "ms", 1e6)]:
        if nanoseconds < limit:
            return f"{nanoseconds / divisor:.3g} {unit}"
    return f"{nanoseconds / 1e9:.3g} s"


def bytes_text(count: float) -> str:
    return f"{count:.0f} B" if count < 10_000 else f"{count / 2**20:.1f} MiB"


def ratio_text(ratio: float) -> str:
    return f"{ratio:.2f}"


def peers_of(line: dict) -> list:
    """The peers of a line, the fastest first."""
    return sorted(line.get("peers", []), key=lambda peer: peer["nanoseconds"])


def best_peer(line: dict):
    """The fastest peer and our ratio to it, or None."""
    peers = peers_of(line)
    if not peers:
        return None
    best = peers[0]
    return best["name"], best["nanoseconds"], line["workNanoseconds"] / best["nanoseconds"]


def reach_text(line: dict) -> str:
    reaches = []
    if "reach" in line:
        reaches.append(f"{line['reach']:g} of limit")
    if "peerReach" in line:
        reaches.append(f"{line['peerReach']:g} of peer")
    return ", ".join(reaches) or "–"


def table(header: list, rows: list) -> str:
    """A Markdown table; the first column is text, the others are figures."""
    lines = [header, [":--"] + ["--:"] * (len(header) - 1)] + rows
    return "\n".join("| " + " | ".join(cells) + " |" for cells in lines)


def times_table(lines: list) -> str:
    rows = []
    for line in lines:
        peer = best_peer(line)
        rows.append([line["work"], time_text(line["workNanoseconds"]),
                     f"{peer[0]}: {time_text(peer[1])}" if peer else "–",
                     f"**{ratio_text(peer[2])}**" if peer else "–",
                     f"{line['limit']}: {time_text(line['limitNanoseconds'])}",
                     f"**{ratio_text(line['ratio'])}**", reach_text(line)])
    return table(["work", "ours", "best peer", "ratio", "limit", "ratio", "to reach"], rows)


def peers_table(lines: list) -> str:
    rows = [[line["work"], time_text(line["workNanoseconds"]),
             ", ".join(f"{peer['name']} {time_text(peer['nanoseconds'])}" for peer in peers_of(line))]
            for line in lines if line.get("peers")]
    return table(["work", "ours", "peers, the fastest first"], rows)


def memory_table(lines: list) -> str:
    rows = [[line["work"], bytes_text(line["workBytes"]),
             f"{line['limit']}: {bytes_text(line['limitBytes'])}",
             ratio_text(line["workBytes"] / line["limitBytes"])]
            for line in lines if line["limitBytes"] > 0]
    return table(["memory", "ours", "limit", "ratio"], rows)


def version_of(package: str) -> str:
    if not shutil.which("dpkg-query"):
        return ""
    asked = subprocess.run(["dpkg-query", "-W", "-f", "${db:Status-Status} ${Version}", package],
                           capture_output=True, text=True, check=False)
    status, _, version = asked.stdout.partition(" ")
    return re.sub(r"^\d+:|[-+~].*$", "", version) if status == "installed" else ""


def machine(figures: dict, missing: list) -> str:
    processor = re.search(r"^model name\s*: (.*)$", Path("/proc/cpuinfo").read_text(), re.M)
    try:
        system = platform.freedesktop_os_release().get("PRETTY_NAME", "Linux")
    except OSError:
        system = "Linux"
    versions = {name: version_of(package) for name, package in PACKAGES.items()}
    lines = [f"- Processor: {processor.group(1) if processor else platform.machine()}, "
             f"{os.cpu_count()} cores seen by the system.",
             f"- System: {system}.",
             f"- Repetitions: {figures['repetitions']} of each work; other work on the machine: load average "
             f"{os.getloadavg()[2]:.1f} over the last quarter of an hour, to which the measurement adds 1.",
             f"- Compiler: {figures['compiler']}, `{figures['options']}`.",
             "- Peers: " + ", ".join(f"{name} {version}" for name, version in versions.items() if version) + "."]
    if missing:
        lines.append("- Not installed, and so not measured: " + ", ".join(missing) + ".")
    return "\n".join(lines)


def page_text(figures: dict, missing: list) -> str:
    times = figures["times"]
    parts = [machine(figures, missing), times_table(times)]
    if any(line.get("peers") for line in times):
        parts += ["Every peer that was measured:", peers_table(times)]
    parts += ["## Memory", memory_table(figures["memory"])]
    return "\n\n".join(parts)


def with_figures(page: str, text: str) -> str:
    if page.count(BEGIN) != 1 or page.count(END) != 1 or page.index(BEGIN) > page.index(END):
        raise SystemExit("the page lacks the comments between which its figures are")
    return page[:page.index(BEGIN)] + BEGIN + "\n\n" + text + "\n\n" + page[page.index(END):]


# ---- The picture ---------------------------------------------------------------------------------

STYLE = """<style>
svg { font: 13px sans-serif; }
.page { fill: #ffffff; }
text { fill: #1c2128; }
.heading { font-size: 16px; font-weight: bold; }
.name { text-anchor: end; }
.tick { text-anchor: middle; }
.grid { stroke: #d0d7de; }
.one { stroke: #57606a; stroke-width: 1.5; }
.peer { fill: #3f78b5; }
.limit { fill: none; stroke: #d98e04; stroke-width: 2; }
@media (prefers-color-scheme: dark) {
.page { fill: #16191e; }
text { fill: #e6e9ed; }
.grid { stroke: #3a414b; }
.one { stroke: #9aa4ae; }
.peer { fill: #6ea8e5; }
.limit { stroke: #f2b544; }
}
</style>
"""
WIDTH, NAMES, PLOT, HEAD, ROW = 1080, 340, 420, 104, 24
LOWEST, HIGHEST = 1 / 16, 8


def x_of(ratio: float) -> float:
    """The place on the logarithmic scale; what is beyond it is at its end."""
    share = math.log(min(max(ratio, LOWEST), HIGHEST) / LOWEST) / math.log(HIGHEST / LOWEST)
    return NAMES + 16 + share * PLOT


def text_at(x: float, y: float, kind: str, text: str) -> str:
    return f'<text class="{kind}" x="{x:.1f}" y="{y:.1f}">{html.escape(text)}</text>\n'


def grid(bottom: float) -> str:
    drawn = ""
    for power in range(round(math.log2(LOWEST)), round(math.log2(HIGHEST)) + 1):
        ratio = 2.0 ** power
        kind = "one" if power == 0 else "grid"
        drawn += f'<line class="{kind}" x1="{x_of(ratio):.1f}" y1="{HEAD}" x2="{x_of(ratio):.1f}" y2="{bottom}"/>\n'
        drawn += text_at(x_of(ratio), HEAD - 6, "tick", f"{ratio:g}" if power >= 0 else f"1/{2 ** -power}")
    return drawn


def row(line: dict, top: float) -> str:
    middle = top + ROW / 2
    peer = best_peer(line)
    drawn = text_at(NAMES, middle + 4, "name", line["work"])
    at = x_of(line["ratio"])
    drawn += (f'<path class="limit" d="M{at:.1f} {middle - 6:.1f}l6 6l-6 6l-6 -6z"><title>'
              f'{ratio_text(line["ratio"])} of the limit</title></path>\n')
    if peer:
        drawn += (f'<circle class="peer" cx="{x_of(peer[2]):.1f}" cy="{middle:.1f}" r="5"><title>'
                  f"{ratio_text(peer[2])} of {html.escape(peer[0])}</title></circle>\n")
        drawn += text_at(NAMES + PLOT + 32, middle + 4, "best", f"{ratio_text(peer[2])} of {peer[0]}")
    return f"<g>\n{drawn}</g>\n"


def picture(figures: dict) -> str:
    lines = figures["times"]
    height = HEAD + ROW * len(lines) + 16
    drawn = (f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {WIDTH} {height}" role="img">\n'
             f"<title>Our times, as parts of the best peer's and of the limit's</title>\n{STYLE}"
             f'<rect class="page" width="{WIDTH}" height="{height}"/>\n')
    drawn += text_at(16, 28, "heading", "Our time, divided by theirs")
    drawn += '<circle class="peer" cx="24" cy="51" r="5"/>\n' + text_at(38, 55, "key", "by the best peer's")
    drawn += '<path class="limit" d="M200 45l6 6l-6 6l-6 -6z"/>\n' + text_at(214, 55, "key", "by the limit's")
    drawn += grid(height - 12)
    for index, line in enumerate(lines):
        drawn += row(line, HEAD + ROW * index)
    return drawn + "</svg>\n"


def main() -> None:
    figures = json.loads(Path(sys.argv[1]).read_text(encoding="utf-8"))
    page = Path(sys.argv[2])
    text = with_figures(page.read_text(encoding="utf-8"), page_text(figures, sys.argv[4:]))
    page.write_text(text, encoding="utf-8")
    Path(sys.argv[3]).write_text(picture(figures), encoding="utf-8")


if __name__ == "__main__":
    main()

#!/usr/bin/env python3
"""The summary of a scripts/bench.sh run, from Google Benchmark's JSON output.

  bench-summary.py summarize DIR
      One JSON object: the machine and the commit, then per benchmark its median time (ns), median
      CPU time, allocations per call and, where DIR holds callgrind counts, instructions per call;
      then the ratio of every benchmark to its floor (the benchmark of the same name + "Floor").
  bench-summary.py readme SUMMARY_JSON README
      Rewrites the part of README between "<!-- bench:begin -->" and "<!-- bench:end -->" with
      the summary's tables: the machine, then each program's benchmarks and the ratios to floors.
  bench-summary.py callgrind RUN_JSON DUMP...
      Instructions per iteration of each benchmark of one run under callgrind: the dumps, in the
      order they were made, are matched to the benchmarks by their iteration counts.
"""
import glob
import json
import os
import re
import subprocess
import sys

UNIT_NS = {"ns": 1.0, "us": 1e3, "ms": 1e6, "s": 1e9}


def load_runs(path):
    """The benchmarks of one program's JSON output; none when it ran none (a filter, say)."""
    try:
        return json.load(open(path))
    except (OSError, ValueError):
        return None


def callgrind(run_json, dumps):
    data = load_runs(run_json)
    runs = data["benchmarks"] if data else []
    parts = []
    for path in dumps:
        if not os.path.exists(path):  # An unmatched glob: the program ran nothing.
            continue
        text = open(path, errors="replace").read()
        iterations = re.search(r"iterations=(\d+)", text)
        total = re.search(r"^summary: (\d+)", text, re.M)
        part = re.search(r"^part: (\d+)", text, re.M)
        if iterations and total and part:
            parts.append((int(part.group(1)), int(iterations.group(1)), int(total.group(1))))
    parts.sort()
    counts = {}
    next_part = 0
    for run in runs:
        if run.get("error_occurred"):
            continue
        # Estimation runs come first, each with fewer iterations than the run reported.
        while next_part < len(parts) and parts[next_part][1] != run["iterations"]:
            next_part += 1
        if next_part == len(parts):
            break
        counts[run["name"]] = parts[next_part][2] / run["iterations"]
        next_part += 1
    json.dump(counts, sys.stdout, indent=1)
    print()


def summarize(directory):
    benchmarks = []
    context = {}
    for path in sorted(glob.glob(os.path.join(directory, "*_bench.json"))):
        program = os.path.basename(path)[: -len(".json")]
        data = load_runs(path)
        if data is None:
            continue
        context = data.get("context", context)
        instructions = {}
        counts_path = os.path.join(directory, program + ".callgrind.json")
        if os.path.exists(counts_path):
            instructions = load_runs(counts_path) or {}
        for run in data["benchmarks"]:
            if run.get("aggregate_name") != "median" or run.get("error_occurred"):
                continue
            name = run["run_name"]
            scale = UNIT_NS[run.get("time_unit", "ns")]
            entry = {
                "name": name,
                "program": program,
                "median_ns": run["real_time"] * scale,
                "cpu_median_ns": run["cpu_time"] * scale,
                "allocs_per_call": run.get("allocs/iter"),
            }
            if name in instructions:
                entry["instructions_per_call"] = round(instructions[name])
            counters = {
                key: value
                for key, value in run.items()
                if key not in ("allocs/iter",) and isinstance(value, float)
                and key not in ("real_time", "cpu_time", "iterations", "repetitions",
                                "repetition_index", "threads", "family_index",
                                "per_family_instance_index")
            }
            if counters:
                entry["counters"] = counters
            benchmarks.append(entry)
    by_name = {entry["name"]: entry for entry in benchmarks}
    ratios = []
    for entry in benchmarks:
        if not entry["name"].endswith("Floor"):
            continue
        measured = by_name.get(entry["name"][: -len("Floor")])
        if measured is None:
            continue
        ratio = {
            "name": measured["name"] + " / floor",
            "time": measured["median_ns"] / entry["median_ns"],
            "cpu_time": measured["cpu_median_ns"] / entry["cpu_median_ns"],
        }
        if "instructions_per_call" in measured and "instructions_per_call" in entry:
            ratio["instructions"] = (
                measured["instructions_per_call"] / entry["instructions_per_call"])
        ratios.append(ratio)
    try:
        commit = subprocess.run(["git", "rev-parse", "--short", "HEAD"], capture_output=True,
                                text=True, check=True).stdout.strip()
    except (OSError, subprocess.CalledProcessError):
        commit = ""
    summary = {
        "commit": commit,
        "machine": {
            "host": context.get("host_name"),
            "cpus": context.get("num_cpus"),
            "mhz_per_cpu": context.get("mhz_per_cpu"),
            "load_avg": context.get("load_avg"),
            "date": context.get("date"),
        },
        "benchmarks": benchmarks,
        "ratios": ratios,
    }
    json.dump(summary, sys.stdout, indent=1)
    print()


def time_text(ns):
    for unit, scale in (("s", 1e9), ("ms", 1e6), ("us", 1e3)):
        if ns >= scale:
            return f"{ns / scale:.3g} {unit}"
    return f"{ns:.3g} ns"


def number_text(value):
    if value is None:
        return ""
    if value < 0.01:  # The one allocation of a benchmark's first pass, spread over its calls.
        return "0"
    return f"{value:,.0f}" if value >= 100 else f"{value:.3g}"


def readme(summary_path, readme_path):
    summary = json.load(open(summary_path))
    machine = summary["machine"]
    lines = [
        f"From the summary of `scripts/bench.sh` (instructions: `--callgrind`, where counted) at "
        f"commit {summary['commit']} on "
        f"{machine['host']} ({machine['cpus']} cores at {machine['mhz_per_cpu']} MHz, load "
        f"average {machine['load_avg'][0]:.1f} at the start of the last program), "
        f"{machine['date']}. Times are medians of 5 repetitions (wall clock, then CPU); "
        "instructions per call are callgrind's count, which the load of the machine does not "
        "change.",
        "",
    ]
    programs = []
    for entry in summary["benchmarks"]:
        if entry["program"] not in programs:
            programs.append(entry["program"])
    for program in programs:
        lines += [f"`{program}`:", "",
                  "| benchmark | time | CPU | allocs | instructions |", "|---|---|---|---|---|"]
        for entry in summary["benchmarks"]:
            if entry["program"] != program:
                continue
            lines.append(
                f"| `{entry['name']}` | {time_text(entry['median_ns'])} | "
                f"{time_text(entry['cpu_median_ns'])} | "
                f"{number_text(entry.get('allocs_per_call'))} | "
                f"{number_text(entry.get('instructions_per_call'))} |")
        lines.append("")
    for ratio in summary["ratios"]:
        text = f"Ratio {ratio['name']}: {ratio['time']:.2f} in time, {ratio['cpu_time']:.2f} in CPU"
        if "instructions" in ratio:
            text += f", {ratio['instructions']:.2f} in instructions"
        lines += [text + ".", ""]
    text = open(readme_path).read()
    begin, end = "<!-- bench:begin -->", "<!-- bench:end -->"
    if begin not in text or end not in text:
        sys.exit(f"{readme_path} has no {begin} ... {end} part")
    head, rest = text.split(begin, 1)
    tail = rest.split(end, 1)[1]
    open(readme_path, "w").write(head + begin + "\n" + "\n".join(lines) + end + tail)


def main():
    if len(sys.argv) >= 3 and sys.argv[1] == "summarize":
        summarize(sys.argv[2])
    elif len(sys.argv) == 4 and sys.argv[1] == "readme":
        readme(sys.argv[2], sys.argv[3])
    elif len(sys.argv) >= 3 and sys.argv[1] == "callgrind":
        callgrind(sys.argv[2], sys.argv[3:])
    else:
        sys.exit(__doc__)


if __name__ == "__main__":
    main()

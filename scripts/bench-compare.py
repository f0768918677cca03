#!/usr/bin/env python3
"""Compares two summaries of scripts/bench.sh, benchmark by benchmark.

  scripts/bench-compare.py BEFORE/summary.json AFTER/summary.json

For two commits: run scripts/bench.sh --out DIR on each, then compare the two summaries. Prints
the median time, allocations and instructions (when counted) of each benchmark in both, and the
change of time; then the ratios to floors.
"""
import json
import sys


def load(path):
    summary = json.load(open(path))
    return summary, {entry["name"]: entry for entry in summary["benchmarks"]}


def time_text(ns):
    for unit, scale in (("s", 1e9), ("ms", 1e6), ("us", 1e3)):
        if ns >= scale:
            return f"{ns / scale:.3g} {unit}"
    return f"{ns:.3g} ns"


def main():
    if len(sys.argv) != 3:
        sys.exit(__doc__)
    before, before_by_name = load(sys.argv[1])
    after, after_by_name = load(sys.argv[2])
    print(f"before {before.get('commit', '')}  after {after.get('commit', '')}")
    print(f"{'benchmark':58} {'before':>10} {'after':>10} {'change':>8} {'allocs':>13} "
          f"{'instructions':>21}")
    for name in list(before_by_name) + [n for n in after_by_name if n not in before_by_name]:
        old, new = before_by_name.get(name), after_by_name.get(name)
        if old is None or new is None:
            only = "after" if old is None else "before"
            print(f"{name:58} (only {only})")
            continue
        change = (new["median_ns"] / old["median_ns"] - 1.0) * 100.0
        allocs = (f"{old.get('allocs_per_call') or 0:.3g} -> "
                  f"{new.get('allocs_per_call') or 0:.3g}")
        instructions = ""
        if "instructions_per_call" in old and "instructions_per_call" in new:
            instructions = f"{old['instructions_per_call']} -> {new['instructions_per_call']}"
        print(f"{name:58} {time_text(old['median_ns']):>10} {time_text(new['median_ns']):>10} "
              f"{change:+7.1f}% {allocs:>13} {instructions:>21}")
    for ratio in after.get("ratios", []):
        previous = next((r for r in before.get("ratios", []) if r["name"] == ratio["name"]), None)
        was = f"{previous['time']:.2f} -> " if previous else ""
        print(f"ratio {ratio['name']}: {was}{ratio['time']:.2f} (time)")


if __name__ == "__main__":
    main()

#!/usr/bin/env python3
"""Compares pxfx_bench JSON runs path by path and flags families that got slower.

Usage: bench_compare.py BASELINE CANDIDATE [--threshold 0.10]

BASELINE and CANDIDATE are each a JSON run or a directory of runs named
run-*.json (such as build-bench, which scripts/performance-report.sh fills with
run-128.json and run-best.json). Runs are matched by the vector target they ran
(`pxfx_target` in their context: scalar, SSE4, AVX2, NEON, ...), so the
128-bit path is compared with the 128-bit path. A family is one benchmark
function (BM_Smooth, CV_Blur, ...); its change is the geometric mean of the
CPU-time ratios (candidate / baseline) of the benchmarks both runs share.
Exits 1 when any family of any path is slower by more than the threshold, 0
otherwise, 2 when no path and benchmark are shared.
"""
import argparse
import json
import math
import os
import sys

SCALE = {"ns": 1e-9, "us": 1e-6, "ms": 1e-3, "s": 1.0}


def load(path):
    with open(path) as f:
        run = json.load(f)
    times = {}
    for b in run["benchmarks"]:
        if b.get("run_type", "iteration") != "iteration" or b.get("error_occurred"):
            continue
        # The fastest of a benchmark's repetitions, as the report takes it.
        t = b["cpu_time"] * SCALE[b.get("time_unit", "ns")]
        times[b["name"]] = min(t, times.get(b["name"], t))
    return run["context"].get("pxfx_target", "unknown"), times


def runs_of(path):
    """Target name -> benchmark times, for a run or a directory of runs."""
    files = [path]
    if os.path.isdir(path):
        files = sorted(os.path.join(path, n) for n in os.listdir(path) if n.startswith("run-") and n.endswith(".json"))
    runs = {}
    for name in files:
        target, times = load(name)
        runs.setdefault(target, {}).update(times)
    return runs


def compare(base, cand, threshold):
    """Prints the change per family; returns the families slower than the threshold."""
    families = {}
    for name in sorted(base.keys() & cand.keys()):
        if base[name] > 0 and cand[name] > 0:
            families.setdefault(name.split("/")[0], []).append(math.log(cand[name] / base[name]))
    slower = []
    for fam, logs in sorted(families.items()):
        change = math.exp(sum(logs) / len(logs)) - 1.0
        flag = "  SLOWER" if change > threshold else ""
        print(f"{fam:32} {len(logs):3d} {change * 100:+7.1f}%{flag}")
        if flag:
            slower.append(fam)
    return families, slower


def main():
    ap = argparse.ArgumentParser()
    ap.add_argument("baseline")
    ap.add_argument("candidate")
    ap.add_argument("--threshold", type=float, default=0.10, help="allowed slowdown (0.10 = 10 %%)")
    opt = ap.parse_args()
    base, cand = runs_of(opt.baseline), runs_of(opt.candidate)
    slower, shared = [], False
    for target in sorted(base.keys() & cand.keys()):
        print(f"\n== path {target}\n{'family':32} {'n':>3} {'change':>8}")
        families, fams = compare(base[target], cand[target], opt.threshold)
        shared = shared or bool(families)
        slower += [f"{fam} ({target})" for fam in fams]
    for target in sorted(base.keys() ^ cand.keys()):
        print(f"path {target} is in only one of the two sides: not compared", file=sys.stderr)
    if not shared:
        print("no path and benchmark in common", file=sys.stderr)
        return 2
    if slower:
        print(f"\n{len(slower)} famil{'y' if len(slower) == 1 else 'ies'} slower by more than "
              f"{opt.threshold * 100:g} %: {', '.join(slower)}")
        return 1
    return 0


if __name__ == "__main__":
    sys.exit(main())

#!/usr/bin/env python3
"""Compares two pxfx_bench JSON runs and flags families that got slower.

Usage: bench_compare.py BASELINE.json CANDIDATE.json [--threshold 0.10]

A family is one benchmark function (BM_Smooth, CV_Blur, ...); its change is
the geometric mean of the CPU-time ratios (candidate / baseline) of the
benchmarks both runs share. Exits 1 when any family is slower by more than
the threshold, 0 otherwise, 2 when the runs share no benchmark.
"""
import argparse
import json
import math
import sys


def load(path):
    with open(path) as f:
        run = json.load(f)
    return {b["name"]: b["cpu_time"] * {"ns": 1e-9, "us": 1e-6, "ms": 1e-3, "s": 1.0}[b.get("time_unit", "ns")]
            for b in run["benchmarks"]
            if b.get("run_type", "iteration") == "iteration" and not b.get("error_occurred")}


def main():
    ap = argparse.ArgumentParser()
    ap.add_argument("baseline")
    ap.add_argument("candidate")
    ap.add_argument("--threshold", type=float, default=0.10, help="allowed slowdown (0.10 = 10 %%)")
    opt = ap.parse_args()
    base, cand = load(opt.baseline), load(opt.candidate)
    families = {}
    for name in sorted(base.keys() & cand.keys()):
        if base[name] > 0 and cand[name] > 0:
            families.setdefault(name.split("/")[0], []).append(math.log(cand[name] / base[name]))
    if not families:
        print("no benchmark in common", file=sys.stderr)
        return 2
    slower = []
    print(f"{'family':32} {'n':>3} {'change':>8}")
    for fam, logs in sorted(families.items()):
        change = math.exp(sum(logs) / len(logs)) - 1.0
        flag = "  SLOWER" if change > opt.threshold else ""
        print(f"{fam:32} {len(logs):3d} {change * 100:+7.1f}%{flag}")
        if flag:
            slower.append(fam)
    if slower:
        print(f"\n{len(slower)} famil{'y' if len(slower) == 1 else 'ies'} slower by more than "
              f"{opt.threshold * 100:g} %: {', '.join(slower)}")
        return 1
    return 0


if __name__ == "__main__":
    sys.exit(main())

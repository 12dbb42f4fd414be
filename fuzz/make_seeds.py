#!/usr/bin/env python3
"""Writes the seed corpus of the direct-call fuzz targets: for every value of
a target's first (dispatch) byte one file, the rest deterministic noise, so
that each run starts with every function family reachable."""
import os
import random

# Number of distinct dispatch values of each target's first byte.
DISPATCH = {"core": 6, "color": 6, "effects": 24, "deform": 10, "toolkit": 8, "retouch": 4, "lines": 3}

here = os.path.dirname(os.path.abspath(__file__))
rng = random.Random(20261122)
for target, count in DISPATCH.items():
    folder = os.path.join(here, "corpus", target)
    os.makedirs(folder, exist_ok=True)
    for k in range(count):
        tail = bytes(rng.randrange(256) for _ in range(160))
        with open(os.path.join(folder, "seed-%02d" % k), "wb") as f:
            f.write(bytes([k]) + tail)

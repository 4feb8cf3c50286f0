"""The Python module's batch colour on many spectra, the figure set against
the C++ batch entry point (colour/spectra_1M/batch in the suite): spectra
per CPU second of the calling thread over calls that together take at least
MIN_TIME seconds, each call filling the same N x 3 outputs, as the C++
figure reuses its own. Prints one line of JSON.

    PYTHONPATH=build/release/python /usr/bin/python3 bench/python_colour.py 1000000 0.5
"""

import json
import sys
import time

import numpy as np

import kvdata


def spectra(n, seed=11):
    """Random walks scaled into 0..100 % like the suite's, a twentieth of
    them dark enough for the linear branch; float32, C-contiguous."""
    rng = np.random.default_rng(seed)
    scale = np.where(rng.random(n) < 0.05, 0.01, rng.uniform(0.05, 1.0, n)).astype(np.float32)
    level = rng.uniform(5.0, 95.0, n).astype(np.float32)
    steps = rng.uniform(-4.0, 4.0, (n, 40)).astype(np.float32)
    out = np.empty((n, 40), np.float32)
    for band in range(40):
        level = np.clip(level + steps[:, band], 0.0, 100.0)
        out[:, band] = level * scale
    return out


def main():
    n = int(sys.argv[1]) if len(sys.argv) > 1 else 1_000_000
    min_time = float(sys.argv[2]) if len(sys.argv) > 2 else 0.5
    data = spectra(n)
    xyz, lab = np.empty((n, 3), np.float32), np.empty((n, 3), np.float32)
    kvdata.calc_xyz_lab_d6510(data, xyz=xyz, lab=lab)   # warm: pages touched once
    calls = 0
    start_cpu, start_wall = time.thread_time(), time.perf_counter()
    while calls == 0 or time.thread_time() - start_cpu < min_time:
        kvdata.calc_xyz_lab_d6510(data, xyz=xyz, lab=lab)
        calls += 1
    cpu = time.thread_time() - start_cpu
    wall = time.perf_counter() - start_wall
    assert xyz.shape == lab.shape == (n, 3)
    print(json.dumps({"spectra": n, "calls": calls, "cpu_s": cpu, "wall_s": wall,
                      "items_per_second": n * calls / cpu}))


if __name__ == "__main__":
    main()

#!/usr/bin/env python3
"""The denoising pipeline of bench_denoise in PyWavelets, for a side-by-side figure.

A 2048x2048 three-plane float image; per plane: wavedec2 with bior2.2 at the maximum
depth, sigma from the median of the finest diagonal band over 0.6745, the universal
threshold sigma * sqrt(2 ln N) applied softly to every detail band, waverec2.
Prints the best of a few runs and the peak of memory traced during one run.
"""
import sys
import time
import tracemalloc

import numpy as np
import pywt

SIDE = int(sys.argv[1]) if len(sys.argv) > 1 else 2048
PLANES = 3
RUNS = 3


def denoise_plane(plane):
    level = pywt.dwt_max_level(min(plane.shape), pywt.Wavelet("bior2.2").dec_len)
    coeffs = pywt.wavedec2(plane, "bior2.2", level=level)
    sigma = np.median(np.abs(coeffs[-1][2])) / 0.6745
    threshold = sigma * np.sqrt(2.0 * np.log(plane.size))
    cleaned = [coeffs[0]] + [tuple(pywt.threshold(d, threshold, mode="soft") for d in detail)
                             for detail in coeffs[1:]]
    return pywt.waverec2(cleaned, "bior2.2")


def main():
    rng = np.random.default_rng(7)
    y, x = np.mgrid[0:SIDE, 0:SIDE].astype(np.float32) / SIDE
    image = np.stack([100 + 80 * x, 60 + 120 * y, 200 - 150 * x * y]).astype(np.float32)
    image += rng.normal(0, 20, image.shape).astype(np.float32)

    best = float("inf")
    for _ in range(RUNS):
        start = time.perf_counter()
        for p in range(PLANES):
            denoise_plane(image[p])
        best = min(best, time.perf_counter() - start)

    tracemalloc.start()
    for p in range(PLANES):
        denoise_plane(image[p])
    _, peak = tracemalloc.get_traced_memory()
    tracemalloc.stop()
    print(f"PyWavelets bior2.2 denoise, {SIDE}x{SIDE}x{PLANES} float: {best * 1000:.0f} ms "
          f"(best of {RUNS}), peak traced memory {peak / image.nbytes:.2f}x the image")


if __name__ == "__main__":
    main()

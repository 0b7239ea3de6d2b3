#!/usr/bin/env python3
"""Draws the time per pixel at every size from what `fused_bench --sizes` prints.

usage: plot_sizes.py sizes.csv chart.png      (scripts/install-packages.sh charts)
"""

import csv
import sys

import matplotlib

matplotlib.use("Agg")
import matplotlib.pyplot as plt  # noqa: E402  (the backend is chosen first)


def main(source, target):
    series = {}
    with open(source, newline="") as file:
        for row in csv.DictReader(file):
            pixels = int(row["width"]) * int(row["height"])
            point = (pixels, float(row["nanoseconds a pixel"]), f"{row['width']}x{row['height']}")
            series.setdefault(row["work"], []).append(point)

    figure, axes = plt.subplots(figsize=(9, 5))
    for work, points in series.items():
        points.sort()
        axes.plot([p[0] for p in points], [p[1] for p in points], marker="o", label=work)
    sizes = sorted({(p[0], p[2]) for points in series.values() for p in points})
    axes.set_xscale("log")
    axes.set_xticks([pixels for pixels, _ in sizes], [name for _, name in sizes], rotation=20)
    axes.minorticks_off()
    axes.set_ylim(bottom=0)
    axes.set_ylabel("nanoseconds per output pixel, one thread")
    axes.set_xlabel("output")
    axes.grid(alpha=0.3)
    axes.legend(fontsize="small")
    figure.tight_layout()
    figure.savefig(target, dpi=100)


if __name__ == "__main__":
    if len(sys.argv) != 3:
        sys.exit(__doc__)
    main(sys.argv[1], sys.argv[2])

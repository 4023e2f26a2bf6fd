#!/usr/bin/env python3
"""Draws the end-to-end frame figures of a benchmark run as an SVG chart (frames per second against
frames per call, ours beside the floor and the python-can peer) and prints the table of every
end-to-end figure with its ratio to its floor, in Markdown.

    plot_bench.py DIR   reads DIR/kvsvbench.json and, if there, DIR/python_can_peer.json;
                        writes DIR/bench.svg
"""
import json
import math
import os
import sys

WIDTH, HEIGHT = 720, 420
LEFT, RIGHT, TOP, BOTTOM = 80, 200, 40, 60

# Series of the chart: benchmark family, counter, label, colour, dashed.
SERIES = [
    ("BM_BusFramesCAN", "per_second", "CAN, library", "#1f5fa8", False),
    ("BM_BusFramesCAN", "floor_per_second", "CAN, driver alone", "#1f5fa8", True),
    ("BM_BusFramesCANFD64", "per_second", "CAN FD 64, library", "#c0392b", False),
    ("BM_BusFramesCANFD64", "floor_per_second", "CAN FD 64, driver alone", "#c0392b", True),
]


def load(directory):
    with open(os.path.join(directory, "kvsvbench.json")) as f:
        run = json.load(f)
    peer = None
    peer_path = os.path.join(directory, "python_can_peer.json")
    if os.path.exists(peer_path):
        with open(peer_path) as f:
            peer = json.load(f)
    return run, peer


def by_name(run):
    return {b["name"]: b for b in run["benchmarks"] if b.get("run_type", "iteration") == "iteration"}


def batches(benchmarks, family):
    points = []
    for name, b in benchmarks.items():
        if name.startswith(family + "/batch:"):
            points.append((int(name.split(":")[1]), b))
    return sorted(points, key=lambda p: p[0])


def svg(benchmarks, peer):
    values = [b[c] for f, c, *_ in SERIES for _, b in batches(benchmarks, f) if c in b]
    if peer:
        values.append(peer["frames_per_second"])
    if not values:
        raise SystemExit("no end-to-end frame figures in the run")
    low = 10 ** math.floor(math.log10(min(values)))
    high = 10 ** math.ceil(math.log10(max(values)))
    plot_w, plot_h = WIDTH - LEFT - RIGHT, HEIGHT - TOP - BOTTOM
    xs = [1, 16, 256, 1000]

    def x_of(batch):
        return LEFT + plot_w * math.log10(batch) / math.log10(xs[-1])

    def y_of(value):
        span = math.log10(high) - math.log10(low)
        return TOP + plot_h * (1 - (math.log10(value) - math.log10(low)) / span)

    out = [f'<svg xmlns="http://www.w3.org/2000/svg" width="{WIDTH}" height="{HEIGHT}" '
           f'font-family="sans-serif" font-size="12">',
           f'<rect width="{WIDTH}" height="{HEIGHT}" fill="white"/>',
           f'<text x="{LEFT}" y="22" font-size="14">Frames per second, written on CAN1 and read '
           f'on CAN2</text>']
    decade = low
    while decade <= high:
        y = y_of(decade)
        out.append(f'<line x1="{LEFT}" y1="{y:.1f}" x2="{LEFT + plot_w}" y2="{y:.1f}" '
                   f'stroke="#ddd"/>')
        out.append(f'<text x="{LEFT - 8}" y="{y + 4:.1f}" text-anchor="end">{decade:,.0f}</text>')
        decade *= 10
    for batch in xs:
        x = x_of(batch)
        out.append(f'<line x1="{x:.1f}" y1="{TOP}" x2="{x:.1f}" y2="{TOP + plot_h}" stroke="#eee"/>')
        out.append(f'<text x="{x:.1f}" y="{TOP + plot_h + 18}" text-anchor="middle">{batch}</text>')
    out.append(f'<text x="{LEFT + plot_w / 2}" y="{HEIGHT - 15}" text-anchor="middle">'
               f'frames per call</text>')
    legend_y = TOP + 10
    for family, counter, label, colour, dashed in SERIES:
        points = [(x_of(n), y_of(b[counter])) for n, b in batches(benchmarks, family)
                  if counter in b]
        if not points:
            continue
        dash = ' stroke-dasharray="6 4"' if dashed else ""
        path = " ".join(f"{x:.1f},{y:.1f}" for x, y in points)
        out.append(f'<polyline points="{path}" fill="none" stroke="{colour}" stroke-width="2"'
                   f'{dash}/>')
        out += [f'<circle cx="{x:.1f}" cy="{y:.1f}" r="3" fill="{colour}"/>' for x, y in points]
        out.append(f'<line x1="{WIDTH - RIGHT + 15}" y1="{legend_y}" x2="{WIDTH - RIGHT + 40}" '
                   f'y2="{legend_y}" stroke="{colour}" stroke-width="2"{dash}/>')
        out.append(f'<text x="{WIDTH - RIGHT + 45}" y="{legend_y + 4}">{label}</text>')
        legend_y += 20
    if peer:
        y = y_of(peer["frames_per_second"])
        out.append(f'<line x1="{LEFT}" y1="{y:.1f}" x2="{LEFT + plot_w}" y2="{y:.1f}" '
                   f'stroke="#27ae60" stroke-width="2" stroke-dasharray="2 3"/>')
        out.append(f'<line x1="{WIDTH - RIGHT + 15}" y1="{legend_y}" x2="{WIDTH - RIGHT + 40}" '
                   f'y2="{legend_y}" stroke="#27ae60" stroke-width="2" stroke-dasharray="2 3"/>')
        out.append(f'<text x="{WIDTH - RIGHT + 45}" y="{legend_y + 4}">python-can, virtual</text>')
    out.append("</svg>")
    return "\n".join(out) + "\n"


def rate(value):
    return f"{value / 1e6:.2f} M" if value >= 1e6 else f"{value / 1e3:.0f} k"


def table(run, benchmarks, peer):
    context = run["context"]
    rows = ["| Path | per call | ours /s | floor /s | ratio | host allocs/call |",
            "|---|---|---|---|---|---|"]
    for name, b in benchmarks.items():
        if "ratio_to_floor" not in b or "per_second" not in b:
            continue
        family, _, batch = name.partition("/batch:")
        rows.append(f"| {family[3:]} | {batch or '-'} | {rate(b['per_second'])} | "
                    f"{rate(b['floor_per_second'])} | {b['ratio_to_floor']:.2f} | "
                    f"{b['host_allocs_per_call']:.0f} |")
        if "ratio_to_decode_floor" in b:
            rows.append(f"| {family[3:]}, beside plain decode | - | {rate(b['per_second'])} | "
                        f"{rate(b['decode_floor_per_second'])} | "
                        f"{b['ratio_to_decode_floor']:.2f} | {b['host_allocs_per_call']:.0f} |")
    head = (f"{context.get('host_name', '?')}, {context['num_cpus']} cores at "
            f"{context['mhz_per_cpu']} MHz, {context['date']}")
    if peer:
        head += (f"; python-can {peer['python_can_version']} virtual bus: "
                 f"{rate(peer['frames_per_second'])} frames/s")
    return head + "\n\n" + "\n".join(rows) + "\n"


def main():
    if len(sys.argv) != 2:
        raise SystemExit(__doc__)
    run, peer = load(sys.argv[1])
    benchmarks = by_name(run)
    with open(os.path.join(sys.argv[1], "bench.svg"), "w") as f:
        f.write(svg(benchmarks, peer))
    sys.stdout.write(table(run, benchmarks, peer))


if __name__ == "__main__":
    main()

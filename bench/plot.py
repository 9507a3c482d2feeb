# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""Plots as SVG text, bars or lines on a logarithmic axis: each function returns the whole file."""

import math
from html import escape

WIDTH = 860
INK, MUTED, RULE = "#1f2933", "#616e7c", "#d9dee4"
LIBRARY, FLOOR, OTHER = "#c2410c", "#9aa5b1", "#3b6ea5"
LINES = ["#3b6ea5", "#2f855a", "#805ad5", "#b7791f", "#0e7490", "#be185d", "#4a5568"]


def color_of(name):
    return {"library": LIBRARY, "floor": FLOOR}.get(name, OTHER)


def text(x, y, content, anchor="start", fill=INK, size=12, weight="normal"):
    return (f'<text x="{x:.1f}" y="{y:.1f}" text-anchor="{anchor}" fill="{fill}" font-size="{size}" '
            f'font-weight="{weight}">{escape(content)}</text>')


def line(x1, y1, x2, y2, stroke=RULE, width=1):
    return f'<line x1="{x1:.1f}" y1="{y1:.1f}" x2="{x2:.1f}" y2="{y2:.1f}" stroke="{stroke}" stroke-width="{width}"/>'


def picture(height, title, parts):
    return "\n".join([
        f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {WIDTH} {height}" width="{WIDTH}" '
        f'height="{height}" font-family="system-ui, sans-serif">',
        f"<title>{escape(title)}</title>",
        f'<rect width="{WIDTH}" height="{height}" fill="white"/>',
        text(16, 26, title, size=15, weight="bold"), *parts, "</svg>", ""])


def bars(title, groups, number):
    """groups: (heading, [(name, label, value)]); each group has a scale of its own."""
    label_width, bar_height, step = 300, 13, 18
    parts, y = [], 44
    for heading, entries in groups:
        y += 18
        parts.append(text(16, y, heading, size=13, weight="bold"))
        y += 8
        scale = (WIDTH - label_width - 110) / max(value for _, _, value in entries)
        for name, label, value in entries:
            weight = "bold" if name == "library" else "normal"
            parts.append(text(label_width - 8, y + 11, label, "end", weight=weight))
            parts.append(f'<rect x="{label_width}" y="{y}" width="{max(value * scale, 0.5):.1f}" '
                         f'height="{bar_height}" fill="{color_of(name)}"/>')
            parts.append(text(label_width + value * scale + 6, y + 11, number(value), fill=MUTED, weight=weight))
            y += step
    return picture(y + 14, title, parts)


def spread(labels, least):
    """Moves the (y, ...) labels apart until each has room."""
    placed = []
    for label in sorted(labels):
        y = max(label[0], placed[-1][0] + least) if placed else label[0]
        placed.append((y, *label[1:]))
    return placed


def even_steps(highest):
    """The marks of an axis from 0."""
    unit = 10 ** math.floor(math.log10(highest))
    unit = next(u for u in (unit / 5, unit / 2, unit, unit * 2) if highest / u <= 8)
    return [i * unit for i in range(math.ceil(highest / unit) + 1)]


def decades(lowest, highest):
    """The marks of a logarithmic axis."""
    return [10.0 ** i for i in range(math.floor(math.log10(lowest)), math.ceil(math.log10(highest)) + 1)]


def lines(title, x_title, y_title, series, number, logarithmic=False):
    """series: (name, label, [(x, y)]) on a logarithmic x axis and a y axis from 0, or a logarithmic one."""
    left, right, top, bottom = 70, 250, 64, 380
    xs = sorted({x for _, _, points in series for x, _ in points})
    ys = [y for _, _, points in series for _, y in points]
    marks = decades(min(ys), max(ys)) if logarithmic else even_steps(max(ys))

    def share(value, first, last, scale):
        return (scale(value) - scale(first)) / max(scale(last) - scale(first), 1e-9)

    def place(x, y):
        along = share(x, xs[0], xs[-1], math.log10)
        up = share(y, marks[0], marks[-1], math.log10 if logarithmic else float)
        return left + along * (WIDTH - left - right), bottom - up * (bottom - top)

    parts = [text(16, 48, y_title, fill=MUTED)]
    for mark in marks:
        _, y = place(xs[0], mark)
        parts += [line(left, y, WIDTH - right, y), text(left - 8, y + 4, number(mark), "end", MUTED)]
    for x in xs:
        px, _ = place(x, marks[0])
        parts += [line(px, bottom, px, bottom + 5, MUTED), text(px, bottom + 20, f"{x:,}", "middle", MUTED)]
    parts.append(text((left + WIDTH - right) / 2, bottom + 40, x_title, "middle", MUTED))

    labels, rest = [], iter(LINES)
    for name, label, points in series:
        stroke = color_of(name) if name in ("library", "floor") else next(rest)
        width = 3 if name == "library" else 1.8
        path = " ".join("%.1f,%.1f" % place(x, y) for x, y in points)
        parts.append(f'<polyline points="{path}" fill="none" stroke="{stroke}" stroke-width="{width}"/>')
        end_x, end_y = place(*points[-1])
        parts += [f'<circle cx="{x:.1f}" cy="{y:.1f}" r="2.5" fill="{stroke}"/>'
                  for x, y in (place(*point) for point in points)]
        labels.append((end_y, label, stroke, end_x))
    for y, label, stroke, end_x in spread(labels, 15):
        parts.append(text(end_x + 10, y + 4, label, fill=stroke))
    return picture(bottom + 56, title, parts)

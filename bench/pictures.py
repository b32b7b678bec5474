#!/usr/bin/env python3
"""Draws the tables of docs/performance.md: pictures.py DOCUMENT
Writes performance.svg, every item's ratios on one axis, and growth.svg, cost over size, beside the
document. Both follow the reader's light or dark mode."""
import math
import re
import sys
from html import escape
from pathlib import Path

STYLE = """<style>
text { font: 13px system-ui, sans-serif; fill: #1f2328; }
.small { font-size: 11px; fill: #59636e; }
.grid { stroke: #d1d9e0; } .level { stroke: #59636e; stroke-width: 1.5; }
.ahead { fill: #1a7f64; } .behind { fill: #c2410c; } .limit { stroke: #6639ba; stroke-width: 2; }
.cost { stroke: #1a7f64; fill: none; stroke-width: 2; } .linear { stroke: #8c959f; stroke-dasharray: 4 3; }
@media (prefers-color-scheme: dark) {
text { fill: #e6edf3; } .small { fill: #9198a1; }
.grid { stroke: #3d444d; } .level { stroke: #9198a1; }
.ahead { fill: #3fb99a; } .behind { fill: #f0883e; } .limit { stroke: #b392f0; }
.cost { stroke: #3fb99a; } .linear { stroke: #768390; }
}
</style>"""
LEAST, MOST = 0.25, 64  # the axis; what lies outside stands at its end


def number(text):
    return float(text.replace(",", ""))


def items(document):
    """{title of a section: (its rows (case, best ratio, limits), its growth rows)}"""
    for title, body in re.findall(r"^## (.+?)\n(.*?)(?=^## |\Z)", document, re.M | re.S):
        cells = [[cell.strip() for cell in line.strip("|").split("|")]
                 for line in body.splitlines() if line.startswith("| ")]
        rows = [(row[0], re.search(r"\*\*([\d.,]+)\*\*", row[2]),
                 re.findall(r" ([\d.,]+)(?:,|$)", row[4]))
                for row in cells if len(row) == 5 and row[0] != "case"]
        growth = [(row[0], [tuple(map(number, point)) for point in
                            re.findall(r"([\d,]+): ([\d.,]*\d)", row[1])], row[2])
                  for row in cells if len(row) == 3 and row[0] != "growth of"]
        if any(best or limits for _, best, limits in rows):
            yield title, rows, growth


def picture(width, height, title, parts):
    return "\n".join([
        f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {width} {height}" role="img" '
        f'aria-label="{escape(title)}">', f"<title>{escape(title)}</title>", STYLE, *parts, "</svg>\n"])


def text(x, y, words, anchor="start", kind=""):
    kind = f' class="{kind}"' if kind else ""
    return f'<text x="{x:.1f}" y="{y:.1f}" text-anchor="{anchor}"{kind}>{escape(words)}</text>'


def line(x1, y1, x2, y2, kind):
    return f'<line x1="{x1:.1f}" y1="{y1:.1f}" x2="{x2:.1f}" y2="{y2:.1f}" class="{kind}"/>'


def overview(sections):
    left, right, lane, top = 190, 870, 30, 62

    def place(ratio):
        share = math.log(min(max(ratio, LEAST), MOST) / LEAST) / math.log(MOST / LEAST)
        return left + share * (right - left)

    bottom = top + lane * len(sections)
    parts = [text(left, 20, "Time of the best peer over the library's: to the right of 1 the library "
                            "is faster", kind="small"),
             '<circle cx="196" cy="34" r="4" class="ahead"/>', text(206, 38, "a case", kind="small"),
             '<circle cx="266" cy="34" r="4" class="behind"/>',
             text(276, 38, "a case where the peer is faster", kind="small"),
             line(470, 28, 470, 40, "limit"), text(478, 38, "what the machine can do", kind="small")]
    for ratio in (0.25, 0.5, 1, 2, 4, 8, 16, 32, 64):
        parts += [line(place(ratio), top - 8, place(ratio), bottom, "level" if ratio == 1 else "grid"),
                  text(place(ratio), bottom + 16, f"{ratio:g}", "middle", "small")]
    for i, (title, rows, _) in enumerate(sections):
        y = top + lane * i + lane / 2 - 4
        parts.append(text(left - 12, y + 4, title, "end"))
        for case, best, limits in rows:
            name = escape(case.replace("`", ""))
            for limit in map(number, limits):
                x = place(limit)
                parts.append(f'<g>{line(x, y - 7, x, y + 7, "limit")}<title>{name}: limit {limit:g}'
                             "</title></g>")
            if best:
                ratio = number(best[1])
                kind = "ahead" if ratio >= 0.95 else "behind"
                parts.append(f'<circle cx="{place(ratio):.1f}" cy="{y:.1f}" r="4" fill-opacity="0.75" '
                             f'class="{kind}"><title>{name}: {ratio:g}</title></circle>')
    return picture(900, bottom + 28, "The library beside its best peers", parts)


def growth(sections):
    series = [(f"{title}: {name.replace('`', '')}", points, exponent)
              for title, _, rows in sections for name, points, exponent in rows if len(points) > 2]
    columns, width, height = 3, 290, 170
    parts = [text(10, 18, "Cost over size, both by powers of ten; dashed: a cost that grows as the size",
                  kind="small")]
    for i, (name, points, exponent) in enumerate(series):
        x0, y0 = 10 + i % columns * 300, 34 + i // columns * (height + 24)
        span = math.log10(points[-1][0] / points[0][0])
        most = max(span, *(math.log10(cost) for _, cost in points))

        def place(size, cost):
            return (x0 + math.log10(size / points[0][0]) / span * width,
                    y0 + height - 8 - math.log10(max(cost, 1)) / most * (height - 60))

        path = " ".join(f"{x:.1f},{y:.1f}" for x, y in (place(*point) for point in points))
        parts += [f'<rect x="{x0}" y="{y0}" width="{width}" height="{height}" fill="none" class="grid"/>',
                  text(x0 + 8, y0 + 18, name),
                  text(x0 + 8, y0 + 34, f"{points[0][0]:,.0f} to {points[-1][0]:,.0f}: exponent "
                                        f"{exponent}", kind="small"),
                  line(*place(points[0][0], 1), *place(points[-1][0], 10 ** span), "linear"),
                  f'<polyline points="{path}" class="cost"/>']
    rows = -(-len(series) // columns)
    return picture(910, 34 + rows * (height + 24), "Growth with size", parts)


def main():
    document = Path(sys.argv[1])
    sections = list(items(document.read_text("utf-8")))
    (document.parent / "performance.svg").write_text(overview(sections), "utf-8")
    (document.parent / "growth.svg").write_text(growth(sections), "utf-8")


main()

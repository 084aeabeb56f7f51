"""Draws how the costs grow, as an SVG on logarithmic scales that is read on a light and on a dark page."""

import math

LEFT, TOP, WIDTH, HEIGHT = 64, 34, 470, 330
LINES = (  # measure, what is drawn, its colours on a light and a dark page
    ("starts", "a start, by credentials", "#9a3412", "#fb923c"),
    ("networks", "an air update, by networks of 40 realms", "#6d28d9", "#c4b5fd"),
    ("credentials", "a change on the disk, by credentials", "#1d4ed8", "#7db4ff"),
    ("clients", "an event, by clients", "#047857", "#34d399"),
    ("records", "the spectrum, by records", "#be123c", "#fb7185"),
)
STYLE = """text{font:12px sans-serif;fill:#333}.axis{stroke:#999}.grid{stroke:#ddd}.along{stroke:#999;stroke-dasharray:4 4}
polyline{fill:none;stroke-width:2}%s
@media(prefers-color-scheme:dark){text{fill:#ddd}.axis,.along{stroke:#777}.grid{stroke:#3a3a3a}%s}"""
UNITS = ("10 ns", "100 ns", "1 µs", "10 µs", "100 µs", "1 ms", "10 ms", "100 ms", "1 s")


class Scale:
    def __init__(self, points):
        costs = [math.log10(cost) for line in points.values() for _, cost in line]
        self.low, self.high = math.floor(min(costs)), math.ceil(max(costs))
        self.decades = range(self.low, self.high + 1)

    def x(self, n):
        return LEFT + WIDTH * math.log10(n) / 3

    def y(self, cost):
        return TOP + HEIGHT * (self.high - math.log10(cost)) / (self.high - self.low)


def frame(scale):
    for exponent in scale.decades:
        y = scale.y(10**exponent)
        yield f'<line class="grid" x1="{LEFT}" x2="{LEFT + WIDTH}" y1="{y:.1f}" y2="{y:.1f}"/>'
        yield f'<text x="{LEFT - 8}" y="{y + 4:.1f}" text-anchor="end">{UNITS[exponent + 2]}</text>'
    for n in (1, 10, 100, 1000):
        x = scale.x(n)
        yield f'<line class="grid" x1="{x:.1f}" x2="{x:.1f}" y1="{TOP}" y2="{TOP + HEIGHT}"/>'
        yield f'<text x="{x:.1f}" y="{TOP + HEIGHT + 18}" text-anchor="middle">{n:,}</text>'
    yield f'<path class="axis" fill="none" d="M{LEFT} {TOP}V{TOP + HEIGHT}H{LEFT + WIDTH}"/>'
    yield f'<text x="{LEFT + WIDTH / 2}" y="{TOP + HEIGHT + 38}" text-anchor="middle">how many there are</text>'
    yield f'<text x="{LEFT}" y="18">time of one, both scales logarithmic; dashed: proportional</text>'


def proportional(scale):
    """What grows along with n: from the lower left corner."""
    last = min(3, scale.high - scale.low)
    x, y = scale.x(10**last), scale.y(10 ** (scale.low + last))
    return f'<line class="along" x1="{LEFT}" x2="{x:.1f}" y1="{TOP + HEIGHT}" y2="{y:.1f}"/>'


def label_places(scale, points):
    """The heights of the labels behind the last points, none upon another."""
    places, lowest = {}, -math.inf
    for name in sorted(points, key=lambda name: scale.y(points[name][-1][1])):
        lowest = places[name] = max(scale.y(points[name][-1][1]) + 4, lowest + 16)
    return places


def colours(column):
    names = ((line[0], line[column]) for line in LINES)
    return "".join(f"text.{n},circle.{n}{{fill:{colour}}}polyline.{n}{{stroke:{colour}}}" for n, colour in names)


def drawing(points):
    """`points` gives for each measure its pairs of a number and the microseconds that it takes."""
    scale = Scale(points)
    labels = label_places(scale, points)
    parts = [*frame(scale), proportional(scale)]
    for name, what, _, _ in LINES:
        ends = [(scale.x(n), scale.y(cost)) for n, cost in points[name]]
        way = " ".join(f"{x:.1f},{y:.1f}" for x, y in ends)
        parts.append(f'<polyline class="{name}" points="{way}"/>')
        parts += [f'<circle class="{name}" cx="{x:.1f}" cy="{y:.1f}" r="3"/>' for x, y in ends]
        parts.append(f'<text class="{name}" x="{LEFT + WIDTH + 10}" y="{labels[name]:.1f}">{what}</text>')
    size = f'viewBox="0 0 {LEFT + WIDTH + 260} {TOP + HEIGHT + 50}"'
    return (
        f'<svg xmlns="http://www.w3.org/2000/svg" {size} role="img" aria-label="How the costs grow">\n'
        f"<style>{STYLE % (colours(2), colours(3))}</style>\n" + "\n".join(parts) + "\n</svg>\n"
    )

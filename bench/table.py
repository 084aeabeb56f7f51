"""The table of what was measured: ours, what stands beside it, and how many times as fast ours is."""

import dataclasses


@dataclasses.dataclass(frozen=True)
class Row:
    what: str
    measure: str
    peer: str  # a side of the measure, or "" where nothing can stand beside it
    beside: str = ""  # what that is
    least: float | None = None  # times as fast
    most_ms: float | None = None

    @property
    def aim(self):
        times = f">= {self.least:g}" if self.least else ""
        cost = f"< {self.most_ms:g} ms" if self.most_ms else ""
        return ", ".join(filter(None, (times, cost)))


ECHO, NODE = "bare echo", "Node, `ws`"
SAVE, SERVERS = "write, flush, rename, flush", "two bare servers"
ROWS = (
    Row("one command, there and back", "one_command", "bare", ECHO),
    Row("", "one_command", "node", NODE),
    Row("64 commands under way, each", "commands_under_way", "bare", ECHO, 0.7),
    Row("", "commands_under_way", "node", NODE, 1.3),
    Row("an event to 200 clients", "fan_out/200", "bare", "bare broadcaster", 1.0),
    Row("a change of 200 credentials, on the disk", "durable_change/200", "bare", SAVE, 0.67),
    Row("a change of 2,000 credentials", "durable_change/2000", "bare", SAVE, 0.67),
    Row("196 networks of 40 realms, all new", "air_update", "bare", "fold and write", most_ms=6),
    Row("the same report again", "air_unchanged", ""),
    Row("a round of the connecting thread over them", "connecting_round", "bare", "hash of realms", most_ms=1),
    Row("the spectrum of 10,000 records", "spectral_pass/10000", "bare", "plain loop", 8),
    Row("a line of the log that is off", "disabled_log", "bare", "a flag"),
    Row("from the start to both ports", "start/1", "bare", SERVERS, 0.5, 15),
    Row("with 2,000 credentials", "start/2000", "bare", SERVERS, most_ms=40),
)
HEAD = ("", "ours", "beside it", "theirs", "times as fast", "aim", "met", "ours, 99 %", "theirs, 99 %")
FIGURES = (1, 3, 4, 7, 8)  # the columns of numbers


def time_text(microseconds):
    for limit, factor, unit in ((0.1, 1e3, "ns"), (1000, 1, "µs"), (float("inf"), 1e-3, "ms")):
        if microseconds < limit:
            return f"{microseconds * factor:.3g} {unit}"
    raise ValueError(microseconds)


def cells(row, ours, peer):
    """A line of the table; `peer` is None where it was not there to be measured."""
    took = 1e6 / ours["per_second"]
    p99s = [time_text(side["p99_us"]) if side and "p99_us" in side else "" for side in (ours, peer)]
    theirs, ratio = ("not there", None) if row.peer else ("", None)
    if peer:
        theirs, ratio = time_text(1e6 / peer["per_second"]), ours["per_second"] / peer["per_second"]
    tests = [ratio >= row.least] if row.least and ratio else []
    tests += [took < row.most_ms * 1000] if row.most_ms else []
    met = ("yes" if all(tests) else "no") if tests else ""
    return (row.what, time_text(took), row.beside, theirs, f"{ratio:.2f}" if ratio else "", row.aim, met, *p99s)


def idle_lines(sides):
    for what, counter, form in (
        ("waking up while nothing happens, a second", "wakeups", "{:.2f}"),
        ("memory while nothing happens", "megabytes", "{:.1f} MB"),
    ):
        ours, bare = (form.format(sides[side][counter]) for side in ("ours", "bare"))
        yield (what, ours, SERVERS, bare, "", "", "", "", "")


def lines(found):
    """`found` gives for each measure its sides, and for each of them its counters."""
    for row in ROWS:
        sides = found[row.measure]
        yield cells(row, sides["ours"], sides.get(row.peer))
    yield from idle_lines(found["idle"])


def text(found):
    """As Markdown that can be read as it is."""
    table = [HEAD, *lines(found)]
    widths = [max(len(line[i]) for line in table) for i in range(len(HEAD))]
    rule = [("-" * (width - 1) + ":") if i in FIGURES else "-" * width for i, width in enumerate(widths)]
    table.insert(1, rule)

    def aligned(line):
        return [cell.rjust(w) if i in FIGURES else cell.ljust(w) for i, (cell, w) in enumerate(zip(line, widths))]

    return "".join("| " + " | ".join(aligned(line)) + " |\n" for line in table)

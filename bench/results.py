# SPDX-License-Identifier: Apache-2.0
"""The one table of bench/run: what was measured, beside what it must reach."""


def number(value):
    """As few digits as say it."""
    if value == int(value) or value >= 1000:
        return f"{value:,.0f}".replace(",", " ")
    return f"{value:.3g}"


def spread(values, unit=""):
    return f"{number(min(values))} – {number(max(values))}{unit} of {len(values)}"


class Results:
    """The rows of the table, and the sections behind it."""

    HEAD = ["what", "must", "aim", "measured", "minimum – maximum, remarks", "reached"]

    def __init__(self):
        self.rows = []
        self.sections = []

    def at_least(self, what, value, must, aim=None, unit="", remarks=""):
        self._add(what, value, must, aim, "≥", unit, remarks, lambda bound: value >= bound)

    def at_most(self, what, value, must, aim=None, unit="", remarks=""):
        self._add(what, value, must, aim, "≤", unit, remarks, lambda bound: value <= bound)

    def figure(self, what, value, unit="", remarks=""):
        """One that nobody demands anything of."""
        self.rows.append((what, "–", "–", f"{number(value)}{unit}", remarks, ""))

    def _add(self, what, value, must, aim, sign, unit, remarks, reaches):
        def bound(limit):
            return "–" if limit is None else f"{sign} {number(limit)}{unit}"
        verdict = "**missed**" if not reaches(must) else "must" if aim is None or not reaches(aim) else "aim"
        self.rows.append((what, bound(must), bound(aim), f"{number(value)}{unit}", remarks, verdict))

    def table(self):
        lines = [self.HEAD, ["---", "---:", "---:", "---:", "---", "---"], *self.rows]
        return "\n".join("| " + " | ".join(cells) + " |" for cells in lines)

    def missed(self):
        return [row[0] for row in self.rows if row[-1] == "**missed**"]

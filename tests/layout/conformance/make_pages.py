#!/usr/bin/env python3
"""Writes the cases of a table of boxes as pages with expectations, one page a case, into folders one a group.

    make_pages.py TABLE FOLDER     writes the pages
    make_pages.py TABLE            tells how many there are and why others are left out

A line of the table is a box: its style, and where it has to stand relative to its parent. Lengths are pixels or
percentages. What the engine has no words for leaves a case out (UNSUPPORTED).
"""
import collections
import csv
import itertools
import pathlib
import sys

# Styles that cannot be written in a page of this engine.
UNSUPPORTED = {
    ("align-items", "baseline"): "baseline alignment",
    ("align-self", "baseline"): "baseline alignment",
    ("align-content", "space-between"): "align-content: space-between and space-around",
    ("align-content", "space-around"): "align-content: space-between and space-around",
    ("justify-content", "space-evenly"): "justify-content: space-evenly",
}
AUTO_MARGIN = "auto margins, which are 0 here"
NO_BOXES = "expects edges or numbers of measures, not boxes"

# The defaults of the table; a page's are others.
SHEET = ("body{margin:0}div{display:flex;flex-direction:column;position:relative;align-content:flex-start;"
         "border:0 solid #000}")
FLEX = ("grow", "shrink", "basis")
LENGTHS = ("left", "top", "right", "bottom", "width", "height", "min-width", "min-height", "max-width", "max-height")


def read_style(text):
    return dict(part.split(":") for part in text.split(";") if part)


def reason_to_leave_out(boxes):
    for box in boxes:
        style = read_style(box["style"])
        for item in style.items():
            if item in UNSUPPORTED:
                return UNSUPPORTED[item]
        if any(name.startswith("margin") and value == "auto" for name, value in style.items()):
            return AUTO_MARGIN
        if not box["width"]:
            return NO_BOXES
    return None


def css_value(name, value):
    is_length = name in LENGTHS or name.startswith(("margin", "padding", "border", "basis"))
    return value + "px" if is_length and value[-1].isdigit() else value


def css_text(style):
    """One `flex` stands for grow, shrink and basis: without it none of them is set in this engine."""
    parts = []
    if any(name in style for name in FLEX):
        parts.append("flex:{} {} {}".format(style.get("grow", "0"), style.get("shrink", "0"),
                                            css_value("basis", style.get("basis", "auto"))))
    for name, value in style.items():
        if name in FLEX:
            continue
        css_name = name + "-width" if name.startswith("border") else name
        parts.append(f"{css_name}:{css_value(name, value)}")
    return ";".join(parts)


def alone(root):
    """In a page of the simple engine a flex element is a root of its own, in no space at all, as the table's roots are.
    Its margins move nothing there."""
    style = read_style(root["style"])
    return "simple", "", [float(root[side]) - float(style.get("margin-" + side, "0").rstrip("%")) for side in
                          ("left", "top")]


def in_a_line(root):
    """A root among other boxes. Its largest size counts as the space that a root has."""
    style = read_style(root["style"])
    sizes = "".join(f"{name}:{css_value(name, style['max-' + name])};" for name in ("width", "height")
                    if "max-" + name in style and name not in style)
    box = f'<div style="position:absolute;left:0;top:0;flex-direction:row;align-items:flex-start;{sizes}">'
    return "block", box, [float(root["left"]), float(root["top"])]


def page_of(boxes, surroundings):
    children = collections.defaultdict(list)
    for box in boxes:
        children[box["parent"]].append(box)
    expected = []

    def markup(box, left, top):
        style = read_style(box["style"])
        shown = style.get("display") != "none"
        if shown:
            expected.append(f"snapped #b{box['box']} | {left:g} {top:g} {box['width']} {box['height']}")
        inner = "".join(markup(child, left + float(child["left"]), top + float(child["top"]))
                        for child in children[box["box"]] if shown)
        return f'<div id="b{box["box"]}" style="{css_text(style)}">{inner}</div>\n'

    root = children[""][0]
    display, container, place = surroundings(root)
    # A root is no item of any line.
    style = read_style(root["style"])
    root = dict(root, style=";".join(f"{name}:{value}" for name, value in style.items() if name not in FLEX))
    body = container + markup(root, *place) + ("</div>" if container else "")
    return ("<!--\n" + "\n".join(expected) + f"\n-->\n<style>{SHEET}body{{display:{display}}}</style>\n<body>\n{body}"
            "</body>\n")


# The flex library takes the percentages of smallest and largest sizes along a line from what holds the line's
# container; a root is held by nothing.
OTHERWISE = {("percentage_flex_basis_main_min_width", in_a_line)}


def main():
    with open(sys.argv[1], newline="", encoding="utf-8") as table:
        lines = list(csv.DictReader(table))
    left_out = collections.Counter()
    written = 0
    for (group, case), boxes in itertools.groupby(lines, key=lambda line: (line["group"], line["case"])):
        boxes = list(boxes)
        reason = reason_to_leave_out(boxes)
        if reason:
            left_out[reason] += 1
            continue
        written += 1
        if len(sys.argv) > 2:
            folder = pathlib.Path(sys.argv[2]) / f"yoga_{group}"
            folder.mkdir(parents=True, exist_ok=True)
            for surroundings in (alone, in_a_line):
                if (case, surroundings) not in OTHERWISE:
                    name = f"{case}.{surroundings.__name__}.html"
                    (folder / name).write_text(page_of(boxes, surroundings), encoding="utf-8")
    print(written, "cases, all of them alone,", written - len(OTHERWISE), "in a line")
    for reason, count in left_out.most_common():
        print(count, "left out:", reason)
    return 0


if __name__ == "__main__":
    sys.exit(main())

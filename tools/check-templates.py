#!/usr/bin/env python3
"""Check the display templates of the log-code technologies.

Usage: check-templates.py [--markdown] [FILE...]

Without FILE, checks resources/QND_GSM.plist, resources/LTE.plist and
resources/UTRAN.plist of this repository. The technology of a file is taken
from its name: QND_GSM, LTE, or any name that contains "UTRAN" (any case).

For each file it verifies that
  - the root is a dictionary and every node is a dictionary, an array or a
    string (no integers, reals, booleans, dates or data);
  - no key contains ";" and no key is "_sorted" (the file's key order is the
    order on screen);
  - every section name of the technology occurs exactly once as a dictionary
    key, at most one group level below the root, with the container kind its
    decoder expects (a dictionary of rows, or an empty array for a list);
  - no group holds a single child;
and prints each section found: name, kind, group and row count (--markdown:
as a markdown table). Exit status: 0 all good, 1 a check failed, 2 bad usage
or an unreadable file.

Standard library only.
"""

import os
import plistlib
import sys
from xml.parsers.expat import ExpatError

ROWS = "rows"
LIST = "list"
EITHER = "placeholder"  # never written by its decoder: any container will do

# Section name -> expected container kind, in class-index order.
SECTIONS = {
    "QND_GSM": {
        "Active Set": LIST,
        "Coding Scheme": EITHER,
        "GPRS Information": ROWS,
        "GSM Serving Cell": ROWS,
        "Mobile Allocation": ROWS,
        "Neighboring Cells": LIST,
        "PDP Context Info": LIST,
        "Process PS": ROWS,
        "UMTS RR Measurement": EITHER,
        "Cell Change Counters": EITHER,
        "Detected Set": LIST,
        "GSM Set": LIST,
        "Non-Ranked GSM Set": EITHER,
        "Process CO": ROWS,
        "Serving PLMN": ROWS,
        "UMTS Set": LIST,
        "Equivalent PLMN List": LIST,
        "GSM RR Info": ROWS,
        "Monitored Set": LIST,
        "Non-Ranked UMTS Set": EITHER,
        "Process CS": ROWS,
        "UMTS RR Info": ROWS,
        "BLER": ROWS,
        "Virtual Active Set": LIST,
        "SIM Info": ROWS,
        "HSDPA Info": ROWS,
    },
    "LTE": {
        "Serving Cell Info": ROWS,
        "Connected mode LTE Intra-frequency Measurement": ROWS,
        "Measured Neighbor Cells": LIST,
        "Detected Cells": LIST,
        "Serving Cell Measurements": ROWS,
        "Neighbor Measurements": ROWS,
        "Neighbor Cells List": LIST,
        "Reselection Candidates": ROWS,
        "Reselection Candidates List": LIST,
        "SIM Info": ROWS,
        "PDP Context Info": LIST,
    },
    "UTRAN": {
        "RRC Info": ROWS,
        "Serving Cell Info": ROWS,
        "Neighbor Cell List": LIST,
        "GSM Neighbor Cell List": LIST,
        "TRCH BLER": LIST,
        "CCTRCH SIR": LIST,
        "PDP Context Info": LIST,
        "SIM Info": ROWS,
    },
}

TYPE_NAMES = {int: "integer", float: "real", bool: "boolean", bytes: "data"}


def technology_of(path):
    name = os.path.splitext(os.path.basename(path))[0]
    if name in ("QND_GSM", "LTE"):
        return name
    if "utran" in name.lower():
        return "UTRAN"
    return None


def kind_of(node):
    if isinstance(node, dict):
        return ROWS
    if isinstance(node, list):
        return LIST
    return None


def check_types(node, path, problems):
    """Only dictionaries, arrays and strings; no ';' and no '_sorted' in keys."""
    if isinstance(node, dict):
        for key, value in node.items():
            if ";" in key:
                problems.append(f"{path}/{key}: key contains ';'")
            if key == "_sorted":
                problems.append(f"{path}/{key}: '_sorted' key (the file order is the screen order)")
            check_types(value, f"{path}/{key}", problems)
    elif isinstance(node, list):
        for i, value in enumerate(node):
            check_types(value, f"{path}/{i}", problems)
    elif not isinstance(node, str):
        type_name = TYPE_NAMES.get(type(node), type(node).__name__)
        problems.append(f"{path or '/'}: {type_name} value (only dictionaries, arrays and strings)")


def find_sections(node, names, parents, found):
    """Collect (name, container, list of enclosing keys) for every key in names, at any depth."""
    if isinstance(node, dict):
        for key, value in node.items():
            if key in names:
                found.append((key, value, list(parents)))
            find_sections(value, names, parents + [key], found)
    elif isinstance(node, list):
        for i, value in enumerate(node):
            find_sections(value, names, parents + [str(i)], found)


def check_groups(root, names, problems):
    """Groups are the top-level dictionaries that are not sections; none may hold a single child."""
    for key, value in root.items():
        if key in names or not isinstance(value, dict):
            continue
        if len(value) == 1:
            problems.append(f"/{key}: group with a single child")


def check_file(path):
    """Returns (technology, rows for the table, problems) or raises OSError/ValueError."""
    technology = technology_of(path)
    if technology is None:
        raise ValueError("cannot tell the technology from the file name")
    with open(path, "rb") as f:
        root = plistlib.load(f)
    problems = []
    if not isinstance(root, dict):
        problems.append("/: root is not a dictionary")
        return technology, [], problems
    check_types(root, "", problems)

    expected = SECTIONS[technology]
    found = []
    find_sections(root, expected, [], found)
    table = []
    seen = {}
    for name, container, parents in found:
        seen[name] = seen.get(name, 0) + 1
        kind = kind_of(container)
        where = "/" + "/".join(parents + [name])
        if kind is None:
            problems.append(f"{where}: section container is a string")
        elif expected[name] != EITHER and kind != expected[name]:
            problems.append(f"{where}: container is a {kind} section, its decoder expects {expected[name]}")
        if kind == LIST and container:
            problems.append(f"{where}: list section with static entries (should be an empty array)")
        if len(parents) > 1:
            problems.append(f"{where}: more than one group level above a section")
        group = "/".join(parents) if parents else "(top level)"
        count = len(container) if kind == ROWS else None
        table.append((name, kind or "string", group, count))
    for name in expected:
        n = seen.get(name, 0)
        if n == 0:
            problems.append(f"section \"{name}\" is missing")
        elif n > 1:
            problems.append(f"section \"{name}\" occurs {n} times")
    check_groups(root, expected, problems)
    return technology, table, problems


def print_plain(path, technology, table):
    print(f"{path} ({technology}): {len(table)} section keys")
    for name, kind, group, count in table:
        rows = "-" if count is None else str(count)
        print(f"  {name}\t{kind}\t{group}\t{rows}")


def print_markdown(path, technology, table):
    print(f"### {technology} (`{os.path.basename(path)}`)")
    print()
    print("| # | Section | Kind | Group | Rows |")
    print("|---|---|---|---|---|")
    for i, (name, kind, group, count) in enumerate(table, 1):
        rows = "-" if count is None else str(count)
        print(f"| {i} | \"{name}\" | {kind} | {group} | {rows} |")
    print()


def main(argv):
    markdown = False
    files = []
    for arg in argv[1:]:
        if arg == "--markdown":
            markdown = True
        elif arg in ("-h", "--help"):
            print(__doc__.strip())
            return 0
        elif arg.startswith("-") and arg != "-":
            print(f"check-templates: unknown option {arg}", file=sys.stderr)
            return 2
        else:
            files.append(arg)
    if not files:
        resources = os.path.join(os.path.dirname(os.path.abspath(__file__)), os.pardir, "resources")
        files = [os.path.normpath(os.path.join(resources, n + ".plist")) for n in ("QND_GSM", "LTE", "UTRAN")]

    status = 0
    for path in files:
        try:
            technology, table, problems = check_file(path)
        except (OSError, ValueError, ExpatError) as e:
            print(f"check-templates: {path}: {e}", file=sys.stderr)
            status = 2
            continue
        (print_markdown if markdown else print_plain)(path, technology, table)
        for p in problems:
            print(f"{path}: {p}", file=sys.stderr)
        if problems and status == 0:
            status = 1
    if status == 0:
        print("all templates pass", file=sys.stderr)
    return status


if __name__ == "__main__":
    sys.exit(main(sys.argv))

#!/usr/bin/env python3
"""Prints the non-blank, non-comment lines of C and C++ under tests/ against those of the code
(src, include, sim, demo, tools, bench), per folder and as a share."""
import pathlib
import re
import sys

SUFFIXES = {".c", ".cc", ".cpp", ".cxx", ".h", ".hh", ".hpp"}
CODE = ["src", "include", "sim", "demo", "tools", "bench"]


def count(path):
    text = path.read_text(errors="replace")
    text = re.sub(r"/\*.*?\*/", lambda m: "\n" * m.group(0).count("\n"), text, flags=re.S)
    lines = 0
    for line in text.splitlines():
        stripped = line.strip()
        if stripped and not stripped.startswith("//"):
            lines += 1
    return lines


def total(root, folder):
    return sum(count(p) for p in (root / folder).rglob("*") if p.suffix in SUFFIXES and p.is_file())


def main():
    root = pathlib.Path(sys.argv[1] if len(sys.argv) > 1 else ".")
    tests = root / "tests"
    for area in sorted(p for p in tests.iterdir() if p.is_dir()):
        print(f"  tests/{area.name:<12} {total(tests, area.name):6d}")
    test_lines = total(root, "tests")
    code_lines = sum(total(root, folder) for folder in CODE if (root / folder).exists())
    print(f"tests {test_lines}, code {code_lines}: {100.0 * test_lines / code_lines:.1f}%")


main()

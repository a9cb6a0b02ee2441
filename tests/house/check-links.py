#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Follows the links of the pages (*.md) to other files of the source tree and to headings. Links to the network are not followed.

    check-links.py SOURCES    exit status: 0 if each leads to a file and a heading, otherwise 1
"""
import re
import sys
from pathlib import Path

BLOCK = re.compile(r"^```.*?^```$", re.MULTILINE | re.DOTALL)  # may have what looks like a heading or a link
LINK = re.compile(r"\[[^\]]*\]\(([^)\s]+)\)")
HEADING = re.compile(r"^#+ +(.*)$", re.MULTILINE)


def text_of(page):
    return BLOCK.sub("", page.read_text(encoding="utf-8"))


def anchors_of(page):
    """The names by which a link can refer to the headings of a page."""
    headings = (re.sub(r"[^\w\- ]", "", heading.lower()) for heading in HEADING.findall(text_of(page)))
    return {heading.strip().replace(" ", "-") for heading in headings}


def problem_of(page, link):
    """The reason why the link leads nowhere, or None."""
    path, _, anchor = link.partition("#")
    target = page.parent / path if path else page
    if not target.exists():
        return "there is no such file"
    if anchor and anchor not in anchors_of(target):
        return "the page has no such heading"
    return None


def main():
    sources = Path(sys.argv[1])
    pages = [*sources.glob("*.md"), *sources.glob("docs/**/*.md")]
    links = [(page, link) for page in pages for link in LINK.findall(text_of(page)) if not re.match(r"[a-z]+:", link)]
    problems = [f"{page}: {link}: {reason}" for page, link in links if (reason := problem_of(page, link))]
    print("\n".join(problems) or f"{len(links)} links of {len(pages)} pages lead to files and headings")
    sys.exit(1 if problems or not links else 0)


main()

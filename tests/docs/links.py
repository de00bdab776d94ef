#!/usr/bin/env python3
"""Every relative link of the guides leads to a file of the tree, and its anchor to a heading there."""

import re
import sys

import examples

LINK = re.compile(r"\[[^\]]*\]\(([^)\s]+)\)")


def anchors(guide):
    """The anchors that a code host gives to the headings of a guide."""
    text = examples.FENCE.sub("", guide.read_text(encoding="utf-8"))
    headings = (re.sub(r"[`*]", "", line) for line in re.findall(r"^#+ +(.*)$", text, re.M))
    return {re.sub(r"[^\w\- ]", "", heading.lower()).replace(" ", "-") for heading in headings}


def errors(guide):
    text = examples.FENCE.sub(lambda fence: "\n" * fence[0].count("\n"), guide.read_text(encoding="utf-8"))
    for number, line in enumerate(text.splitlines(), 1):
        for target in LINK.findall(line):
            path, _, anchor = target.partition("#")
            if ":" in path:
                continue
            file = (guide.parent / path).resolve() if path else guide
            if not file.exists():
                yield f"{guide.relative_to(examples.ROOT)}:{number}: there is no {path}"
            elif anchor and anchor not in anchors(file):
                yield f"{guide.relative_to(examples.ROOT)}:{number}: {file.name} has no heading #{anchor}"


def main():
    # A page in cmake/ is written for the installed tree: the test of the SDK follows its links there.
    guides = [guide for guide in examples.GUIDES if guide.parent.name != "cmake"]
    found = [error for guide in guides for error in errors(guide)]
    print("\n".join(found) or f"the links of {len(guides)} guides lead somewhere")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())

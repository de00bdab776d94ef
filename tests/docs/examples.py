"""The fenced examples of the guides: of every Markdown file outside build/.

A comment on the line above a fence says how the example is to be read:

    <!-- file: FOLDER/NAME -->      it is this file; the tests of the SDK build it
    <!-- given: PARAMETERS -->      it is the body of a function with these parameters
"""

import re
from pathlib import Path
from typing import NamedTuple

ROOT = Path(__file__).resolve().parents[2]
GUIDES = sorted(file for file in ROOT.rglob("*.md") if file.relative_to(ROOT).parts[0] != "build")
FENCE = re.compile(r"^(?:<!-- (?P<mark>\w+): (?P<value>[^\n]*) -->\n)?"
                   r"```(?P<language>\w*)\n(?P<text>.*?)^```$", re.M | re.S)


class Example(NamedTuple):
    place: str  # guide and line, as compilers print them
    language: str
    mark: str  # "file", "given" or empty
    value: str
    text: str


def examples(guide):
    content = guide.read_text(encoding="utf-8")
    for found in FENCE.finditer(content):
        line = content.count("\n", 0, found.start("text")) + 1
        yield Example(f"{guide.relative_to(ROOT)}:{line}", found["language"], found["mark"] or "",
                      found["value"] or "", found["text"])


def all_examples(language):
    return [example for guide in GUIDES for example in examples(guide) if example.language == language]

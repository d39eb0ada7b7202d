"""Finds exports by their names and texts."""

import fnmatch
import textwrap

from .calls import NoSuchExport, hint
from .library import library


def first_sentence(documentation):
    text = " ".join(documentation.split())
    end = text.find(". ")
    return text if end < 0 else text[:end + 1]


def summary(entry, width=90):
    """A summary in one line. For an export that shares the text of another, it is its own text and that text."""
    text = first_sentence(entry["documentation"])
    if entry["inherited"]:
        root = library().entries[entry["inherited"][-1]]
        text = f"{text} {first_sentence(root['documentation'])}"
    return textwrap.shorten(text, width, placeholder=" ...")


class Found(list):
    """Names of exports, shown with a line on each."""

    def __repr__(self):
        return "\n".join(f"{name:<30} {summary(library().entries[name])}" for name in self)


def _words(entry):
    texts = [entry["documentation"], *(library().entries[name]["documentation"]
                                       for name in entry["inherited"])]
    return " ".join(" ".join(texts).split()).lower()


def find(pattern="*"):
    """The exports whose name matches a pattern with * or ?. Without these, those that have the word, or all of
    several words, in their name, family or text; matches of names come first."""
    entries = library().entries
    lower = pattern.lower()
    if any(mark in pattern for mark in "*?["):
        found = [name for name in entries if fnmatch.fnmatch(name.lower(), lower)]
    else:
        words = lower.split()
        by_name = [name for name in entries if all(word in name.lower() for word in words)]
        by_text = [name for name, entry in entries.items() if name not in by_name and all(
            word in f"{name.lower()} {entry['family']} {_words(entry)}" for word in words)]
        found = by_name + by_text
    if not found:
        raise NoSuchExport(f"no export has {pattern!r} in its name or text{hint(pattern, entries)}")
    return Found(found)

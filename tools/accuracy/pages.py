"""Shared by the scripts that write pages of docs/accuracy."""


def table(head, rows):
    """A Markdown table; each row is also printed as soon as it is known."""
    lines = ["| " + " | ".join(head) + " |", "|---" * len(head) + "|"]
    for row in rows:
        print(row, flush=True)
        lines.append(row)
    return "\n".join(lines)

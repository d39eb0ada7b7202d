"""What the options of several commands take."""

import argparse


def positive(text):
    value = float(text)
    if not 0 < value < float("inf"):
        raise argparse.ArgumentTypeError(f"{text} is not above 0")
    return value

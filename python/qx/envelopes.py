"""The outline of a signal of any length: the lowest and the highest values of blocks, which grow with the signal."""

import numpy as np

from .figures import extremes


class Envelope:
    """Takes a signal part by part and keeps at most `most` blocks, or all samples while there are fewer. A block
    has `samples` samples."""

    def __init__(self, most=1 << 16):
        self.most, self.samples, self.count = most, 1, 0
        self._lows, self._highs, self._blocks = np.empty(most), np.empty(most), 0
        self._rest = np.empty(0)  # samples of the incomplete block

    def add(self, values):
        self.count += len(values)
        values = np.concatenate([self._rest, values])
        while len(values) >= self.samples:
            room = (self.most - self._blocks) * self.samples
            if not room:
                self._halve()
                continue
            part = values[:min(room, len(values) // self.samples * self.samples)]
            lows, highs = extremes(part, self.samples)
            self._lows[self._blocks:self._blocks + len(lows)] = lows
            self._highs[self._blocks:self._blocks + len(lows)] = highs
            self._blocks += len(lows)
            values = values[len(part):]
        self._rest = values.copy()

    def _halve(self):
        half = self._blocks // 2
        self._lows[:half], self._highs[:half] = extremes(self._lows[:self._blocks], 2, self._highs[:self._blocks])
        self._blocks, self.samples = half, 2 * self.samples

    def __getstate__(self):
        """Leaves out the space for further blocks."""
        return {**self.__dict__, "_lows": self._lows[:self._blocks], "_highs": self._highs[:self._blocks]}

    def bounds(self):
        """The lowest and the highest values of the blocks; the last block may be shorter."""
        lows, highs = self._lows[:self._blocks], self._highs[:self._blocks]
        if len(self._rest):
            lows, highs = np.append(lows, np.fmin.reduce(self._rest)), np.append(highs, np.fmax.reduce(self._rest))
        return lows, highs

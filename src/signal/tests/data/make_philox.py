#!/usr/bin/python3
"""Blocks of Philox4x32-10 for noise_test, by the definition in integers: key, stream, position, kind, then
words 1 and 2. The same code with words of 64 bits is first compared with NumPy's Philox.

usage: make_philox.py > philox.dat
"""

import random

import numpy as np

FACTORS = {32: (0xD2511F53, 0xCD9E8D57), 64: (0xD2E7470EE14C6C93, 0xCA5A826395121157)}
STEPS = {32: (0x9E3779B9, 0xBB67AE85), 64: (0x9E3779B97F4A7C15, 0xBB67AE8584CAA73B)}


def philox(counter, key, bits):
    c, k, mask = list(counter), list(key), 2**bits - 1
    for _ in range(10):
        first, second = FACTORS[bits][0] * c[0], FACTORS[bits][1] * c[2]
        c = [second >> bits ^ c[1] ^ k[0], second & mask, first >> bits ^ c[3] ^ k[1], first & mask]
        k = [(a + b) & mask for a, b in zip(k, STEPS[bits])]
    return c


draw = random.Random(20261122)
for _ in range(100):
    words = [draw.getrandbits(64) for _ in range(6)]
    theirs = np.random.Philox(counter=np.array(words[:4], np.uint64),
                              key=np.array(words[4:], np.uint64)).random_raw(4)
    ahead = (sum(word << 64 * i for i, word in enumerate(words[:4])) + 1) % 2**256  # NumPy increments the counter first
    assert philox([ahead >> 64 * i & 2**64 - 1 for i in range(4)], words[4:], 64) == [int(x) for x in theirs]

for _ in range(40):
    key, stream = (draw.getrandbits(32) - 2**31 for _ in range(2))
    position, kind = draw.getrandbits(draw.choice((3, 31, 33, 53))), draw.randrange(1, 7)
    w = philox([position % 2**32, position >> 32, 0, kind], [key % 2**32, stream % 2**32], 32)
    print("Philox", key, stream, position, kind, w[1], w[2])

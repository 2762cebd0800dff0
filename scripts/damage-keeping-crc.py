#!/usr/bin/env python3
"""Writes random bytes into sections of a capture and gives each damaged section
a valid CRC_32 again, so that the damage passes the receiver's CRC check and
reaches the parse operations (anyone with a transmitter can compute a CRC).

Usage: scripts/damage-keeping-crc.py [--sections] INPUT OUTPUT SEED SPOTS

INPUT is a stream of 188-byte packets (or, with --sections, concatenated raw
sections). SPOTS sections that carry a CRC_32 (section_syntax_indicator 1, or
the TOT) are picked at random; 1 to 4 bytes of each, between the section header
and the CRC_32, are overwritten; the framing (section_length, packet headers)
is left alone. Prints how many sections were damaged and how many that carry a
CRC_32 were left intact.
"""
import random
import sys

PACKET = 188
TOT_TABLE_ID = 0x73


def crc_table():
    table = []
    for i in range(256):
        c = i << 24
        for _ in range(8):
            c = ((c << 1) ^ 0x04C11DB7) if c & 0x80000000 else (c << 1)
        table.append(c & 0xFFFFFFFF)
    return table


CRC_TABLE = crc_table()


def crc32_mpeg2(data):
    crc = 0xFFFFFFFF
    for b in data:
        crc = ((crc << 8) & 0xFFFFFFFF) ^ CRC_TABLE[((crc >> 24) ^ b) & 0xFF]
    return crc


def sections_of_stream(data):
    """Offsets of the bytes of every complete section, PID by PID, the way the
    section store reassembles them (pointer_field, section_length, stuffing)."""
    sections, pending = [], {}

    def take(pid):
        offsets = pending.get(pid)
        while offsets is not None and len(offsets) >= 3:
            if data[offsets[0]] == 0xFF:
                pending[pid] = None
                return
            size = 3 + (((data[offsets[1]] & 0x0F) << 8) | data[offsets[2]])
            if len(offsets) < size:
                return
            sections.append(offsets[:size])
            offsets = offsets[size:]
            pending[pid] = offsets if offsets else None

    for packet in range(0, len(data) - PACKET + 1, PACKET):
        p = data[packet:packet + 4]
        if p[0] != 0x47 or not (p[3] >> 4) & 1:
            continue
        pid = ((p[1] & 0x1F) << 8) | p[2]
        at = packet + 4 + (1 + data[packet + 4] if (p[3] >> 4) & 2 else 0)
        end = packet + PACKET
        if at >= end:
            continue
        if p[1] & 0x40:
            start = at + 1 + data[at]
            if start > end:
                continue
            if pending.get(pid) is not None:
                pending[pid] += list(range(at + 1, start))
                take(pid)
            pending[pid], at = [], start
        elif pending.get(pid) is None:
            continue
        pending[pid] += list(range(at, end))
        take(pid)
    return sections


def sections_of_file(data):
    sections, at = [], 0
    while at + 3 <= len(data):
        if data[at] == 0xFF:
            at += 1
            continue
        size = 3 + (((data[at + 1] & 0x0F) << 8) | data[at + 2])
        if at + size > len(data):
            break
        sections.append(list(range(at, at + size)))
        at += size
    return sections


def main():
    args = sys.argv[1:]
    raw = args[:1] == ["--sections"]
    if raw:
        args = args[1:]
    if len(args) != 4:
        sys.exit(__doc__)
    source, target, seed, spots = args[0], args[1], int(args[2]), int(args[3])
    data = bytearray(open(source, "rb").read())
    rng = random.Random(seed)
    found = sections_of_file(data) if raw else sections_of_stream(data)
    with_crc = [s for s in found if len(s) > 3 + 4 and (data[s[1]] & 0x80 or data[s[0]] == TOT_TABLE_ID)]
    damaged = set()
    for _ in range(spots if with_crc else 0):
        index = rng.randrange(len(with_crc))
        offsets = with_crc[index]
        for _ in range(rng.randint(1, 4)):
            data[offsets[rng.randrange(3, len(offsets) - 4)]] = rng.randrange(256)
        damaged.add(index)
    for index in damaged:
        offsets = with_crc[index]
        crc = crc32_mpeg2(bytes(data[o] for o in offsets[:-4]))
        for i in range(4):
            data[offsets[-4 + i]] = (crc >> (24 - 8 * i)) & 0xFF
    open(target, "wb").write(data)
    print(len(damaged), len(with_crc) - len(damaged))


if __name__ == "__main__":
    main()

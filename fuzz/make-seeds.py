#!/usr/bin/env python3
"""Seed corpora of the fuzz targets, made from the shared broadcast captures.

Usage: fuzz/make-seeds.py CAPTURES_DIR OUT_DIR

Writes OUT_DIR/<target>/<sha1> files: sections by table, DSM-CC messages, runs
of packets of one PID or of several and the descriptors found in the tables' loops, each with
the leading byte the target reads first (repairs, class choice). The corpora
are made again on demand and never committed.
"""
import hashlib
import os
import sys

PACKET = 188


def packets_by_pid(stream):
    pids = {}
    for at in range(0, len(stream) - PACKET + 1, PACKET):
        p = stream[at:at + PACKET]
        if p[0] != 0x47:
            continue
        pids.setdefault(((p[1] & 0x1F) << 8) | p[2], []).append(p)
    return pids


def section_size(b, at=0):
    return (((b[at + 1] & 0x0F) << 8) | b[at + 2]) + 3


def sections_of(packets):
    """Sections of one PID: pointer_field and section_length, stuffing ends a packet."""
    sections, pending, active = [], bytearray(), False

    def take():
        nonlocal pending, active
        while active and len(pending) >= 3:
            if pending[0] == 0xFF:
                active, pending = False, bytearray()
                return
            size = section_size(pending)
            if len(pending) < size:
                return
            sections.append(bytes(pending[:size]))
            pending = pending[size:]
            if not pending:
                active = False

    for p in packets:
        control = (p[3] >> 4) & 3
        at = 4 + (1 + p[4] if control & 2 else 0)
        if not control & 1 or at >= PACKET:
            continue
        if p[1] & 0x40:
            start = at + 1 + p[at]
            if start > PACKET:
                continue
            if active:
                pending += p[at + 1:start]
                take()
            pending, active = bytearray(p[start:]), True
        elif active:
            pending += p[at:]
        take()
    return sections


def packetize(sections, pid):
    """Transport packets of one PID carrying these sections, each starting a packet."""
    packets, counter = [], 0
    for s in sections:
        payload = b"\x00" + s
        first = True
        while payload:
            piece, payload = payload[:PACKET - 4], payload[PACKET - 4:]
            header = bytes([0x47, (0x40 if first else 0) | (pid >> 8), pid & 0xFF, 0x10 | counter])
            packets.append(header + piece + b"\xff" * (PACKET - 4 - len(piece)))
            counter, first = (counter + 1) & 0x0F, False
    return packets


def runs_from_section_starts(packets, length, count):
    """Up to `count` runs of `length` packets, each starting where a section starts."""
    starts = [i for i, p in enumerate(packets) if p[1] & 0x40]
    runs, last = [], -length
    for i in starts:
        if i >= last + length:
            runs.append(b"".join(packets[i:i + length]))
            last = i
            if len(runs) == count:
                break
    return runs


def split_sections(contents):
    out, at = [], 0
    while at + 3 <= len(contents):
        size = section_size(contents, at)
        if at + size > len(contents):
            break
        out.append(contents[at:at + size])
        at += size
    return out


def loop(b, start, length):
    """Descriptors of a loop: (tag, length, body) runs, stopped at the loop end."""
    out, at, end = [], start, min(start + length, len(b))
    while at + 2 <= end:
        size = 2 + b[at + 1]
        if at + size > end:
            break
        out.append(b[at:at + size])
        at += size
    return out


def len12(b, at):
    return ((b[at] & 0x0F) << 8) | b[at + 1] if at + 2 <= len(b) else 0


def descriptors_of(s):
    """Descriptors of the loops of the tables the library parses."""
    t, end, out = s[0], len(s) - 4, []
    body = s[:end]
    try:
        if t == 0x02:  # PMT
            n = len12(body, 10)
            out += loop(body, 12, n)
            at = 12 + n
            while at + 5 <= end:
                es = len12(body, at + 3)
                out += loop(body, at + 5, es)
                at += 5 + es
        elif t in (0x40, 0x41):  # NIT
            n = len12(body, 8)
            out += loop(body, 10, n)
            at = 10 + n + 2
            while at + 6 <= end:
                d = len12(body, at + 4)
                out += loop(body, at + 6, d)
                at += 6 + d
        elif t in (0x42, 0x46):  # SDT
            at = 11
            while at + 5 <= end:
                d = len12(body, at + 3)
                out += loop(body, at + 5, d)
                at += 5 + d
        elif t == 0x4E or 0x4F <= t <= 0x6F:  # EIT
            at = 14
            while at + 12 <= end:
                d = len12(body, at + 10)
                out += loop(body, at + 12, d)
                at += 12 + d
        elif t == 0xC4:  # BIT
            n = len12(body, 8)
            out += loop(body, 10, n)
            at = 10 + n
            while at + 3 <= end:
                d = len12(body, at + 1)
                out += loop(body, at + 3, d)
                at += 3 + d
        elif t == 0x73:  # TOT
            out += loop(body, 10, len12(body, 8))
        elif t == 0x74:  # AIT
            n = len12(body, 8)
            out += loop(body, 10, n)
            at = 10 + n + 2
            while at + 9 <= end:
                d = len12(body, at + 7)
                out += loop(body, at + 9, d)
                at += 9 + d
        elif t == 0x3D:  # stream descriptors
            out += loop(body, 8, end - 8)
        elif t == 0x3B and len(s) > 20 and (s[10] << 8 | s[11]) == 0x1002:  # DII module info
            m = s[8:end]
            b = 12 + m[9]
            at = b + 16 + ((m[b + 16] << 8) | m[b + 17])
            count = (m[at + 2] << 8) | m[at + 3]
            at += 4
            for _ in range(count):
                if at + 8 > len(m):
                    break
                out += loop(m, at + 8, m[at + 7])
                at += 8 + m[at + 7]
    except IndexError:
        pass
    return out


class Corpus:
    def __init__(self, root):
        self.root = root
        self.counts = {}

    def add(self, target, data):
        folder = os.path.join(self.root, target)
        os.makedirs(folder, exist_ok=True)
        name = hashlib.sha1(data).hexdigest()
        path = os.path.join(folder, name)
        if not os.path.exists(path):
            with open(path, "wb") as f:
                f.write(data)
            self.counts[target] = self.counts.get(target, 0) + 1


# Table targets by table_id; every section also seeds fuzz_sections.
TABLE_TARGETS = {
    0x00: "fuzz_table_pat", 0x02: "fuzz_table_pmt", 0x40: "fuzz_table_nit", 0x41: "fuzz_table_nit",
    0x42: "fuzz_table_sdt", 0x46: "fuzz_table_sdt", 0x70: "fuzz_table_tdt", 0x73: "fuzz_table_tot",
    0x74: "fuzz_table_ait", 0xC4: "fuzz_table_bit", 0x3D: "fuzz_table_stream_event",
}
for _t in [0x4E, 0x4F] + list(range(0x50, 0x70)):
    TABLE_TARGETS[_t] = "fuzz_table_eit"

# How many of one kind are worth keeping: the captures hold hundreds of alike
# data blocks and event sections.
LIMIT_PER_KIND = 24

# The receivers' path: runs of packets long enough to complete the sections
# that start in them, a few per PID; raw section files are carried on one PID.
RECEIVER_RUN = 32
RECEIVER_RUNS_PER_PID = 6
RAW_SECTIONS_PID = 0x0100


def main():
    if len(sys.argv) != 3:
        sys.exit(__doc__)
    captures, out = sys.argv[1], sys.argv[2]
    corpus = Corpus(out)
    sections = []
    for name in sorted(os.listdir(captures)):
        path = os.path.join(captures, name)
        with open(path, "rb") as f:
            contents = f.read()
        if name.endswith(".sections"):
            found = split_sections(contents)
            sections += found
            packets = packetize(found, RAW_SECTIONS_PID)
            for run in range(0, len(packets), RECEIVER_RUN):
                corpus.add("fuzz_receivers", b"".join(packets[run:run + RECEIVER_RUN]))
        elif name.endswith(".ts"):
            for pid, packets in sorted(packets_by_pid(contents).items()):
                # Runs of 16 packets, a few per PID, for the packet targets.
                for run in range(0, min(len(packets), 16 * 4), 16):
                    for target in ("fuzz_packets", "fuzz_section_assembler"):
                        corpus.add(target, b"".join(packets[run:run + 16]))
                sections += sections_of(packets)
                for run in runs_from_section_starts(packets, RECEIVER_RUN, RECEIVER_RUNS_PER_PID):
                    corpus.add("fuzz_receivers", run)
            # Packets of several PIDs as they come, for the stores side by side.
            for at in range(0, min(len(contents), 4 * RECEIVER_RUN * PACKET), RECEIVER_RUN * PACKET):
                corpus.add("fuzz_receivers", contents[at:at + RECEIVER_RUN * PACKET])

    kinds = {}
    descriptors = {}
    for s in sections:
        if len(s) < 3:
            continue
        t = s[0]
        kind = (t, s[10] << 8 | s[11]) if t in (0x3B, 0x3C) and len(s) >= 12 else (t,)
        kinds[kind] = kinds.get(kind, 0) + 1
        if kinds[kind] > LIMIT_PER_KIND:
            continue
        corpus.add("fuzz_sections", b"\x00" + s)
        if t in TABLE_TARGETS:
            corpus.add(TABLE_TARGETS[t], b"\x00" + s)
        if t in (0x3B, 0x3C) and len(s) >= 24:
            corpus.add("fuzz_dsmcc", b"\x00" + s[8:-4])
        for d in descriptors_of(s):
            descriptors.setdefault(d[0], set()).add(d)

    for tag, found in sorted(descriptors.items()):
        for d in sorted(found)[:8]:
            # The factory, and the classes of the tag under both standards.
            for choice in (0x00, 0x01, 0x81):
                corpus.add("fuzz_descriptors", bytes([choice]) + d)

    for target, count in sorted(corpus.counts.items()):
        print("%-26s %5d seeds" % (target, count))


if __name__ == "__main__":
    main()

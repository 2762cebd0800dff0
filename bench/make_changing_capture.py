#!/usr/bin/env python3
"""A transport stream whose tables change on every repetition, for measuring
the peak memory of ravel-dump over inputs of different lengths.

  make_changing_capture.py eit|carousel REPETITIONS OUTPUT

eit:      a PAT, then per repetition an EIT present/following section of one
          service whose version and event (start time, name) change each time.
carousel: a PAT and a PMT naming a carousel PID, then per repetition a DII of
          a new download whose modules are 64 KiB, of which only the first
          blocks are sent: no module ever completes.
"""
import sys


def crc32_mpeg(data):
    crc = 0xFFFFFFFF
    for byte in data:
        crc ^= byte << 24
        for _ in range(8):
            crc = ((crc << 1) ^ 0x04C11DB7) if crc & 0x80000000 else crc << 1
            crc &= 0xFFFFFFFF
    return crc


def long_section(table_id, extension, version, body, number=0, last=0):
    length = 5 + len(body) + 4
    head = bytes([table_id, 0xB0 | (length >> 8), length & 0xFF, extension >> 8, extension & 0xFF,
                  0xC1 | ((version & 0x1F) << 1), number, last])
    section = head + body
    return section + crc32_mpeg(section).to_bytes(4, "big")


class Packetizer:
    def __init__(self):
        self.counters = {}

    def packets(self, pid, section):
        payload = b"\x00" + section  # pointer_field
        out = bytearray()
        first = True
        while payload:
            chunk, payload = payload[:184], payload[184:]
            counter = self.counters.get(pid, 0)
            self.counters[pid] = (counter + 1) & 0x0F
            out += bytes([0x47, (0x40 if first else 0) | (pid >> 8), pid & 0xFF, 0x10 | counter])
            out += chunk + b"\xFF" * (184 - len(chunk))
            first = False
        return bytes(out)


def bcd(value):
    return ((value // 10) << 4) | (value % 10)


def eit(n, ts):
    out = bytearray(ts.packets(0x0000, long_section(0x00, 1, 0, bytes([0, 1, 0xE1, 0x00]))))
    for i in range(n):
        name = ("Event %d" % i).encode()
        short = bytes([0x4D, 5 + len(name)]) + b"por" + bytes([len(name)]) + name + b"\x00"
        minute = i % 60
        event = (i & 0xFFFF).to_bytes(2, "big") + (0xE3F0).to_bytes(2, "big") + bytes(
            [bcd(i // 60 % 24), bcd(minute), 0]) + bytes([0, 30, 0]) + (0x8000 | len(short)).to_bytes(2, "big") + short
        body = (1).to_bytes(2, "big") + (1).to_bytes(2, "big") + bytes([0, 0x4E]) + event
        out += ts.packets(0x0012, long_section(0x4E, 0x0001, i, body))
    return out


def carousel(n, ts):
    pat = long_section(0x00, 1, 0, bytes([0, 1, 0xE1, 0x00]))
    pmt = long_section(0x02, 1, 0, bytes([0xE1, 0x01, 0xF0, 0x00, 0x0B, 0xE2, 0x00, 0xF0, 0x00]))
    out = bytearray(ts.packets(0x0000, pat) + ts.packets(0x0100, pmt))
    block = 4066
    for i in range(n):
        download = 0x1000 + i
        modules = b"".join(m.to_bytes(2, "big") + (65536).to_bytes(4, "big") + bytes([1, 0]) for m in range(4))
        message = (download.to_bytes(4, "big") + block.to_bytes(2, "big") + bytes(10) + (0).to_bytes(2, "big") +
                   (4).to_bytes(2, "big") + modules + (0).to_bytes(2, "big"))
        header = bytes([0x11, 0x03, 0x10, 0x02]) + (0x80000000 | (i & 0x7FFF) << 1).to_bytes(4, "big") + bytes(
            [0xFF, 0]) + len(message).to_bytes(2, "big")
        out += ts.packets(0x0200, long_section(0x3B, 0x0002, i, header + message))
        for m in range(4):
            for b in range(2):  # 2 of 17 blocks: never complete
                data = bytes([(i + m + b) & 0xFF]) * block
                ddb = m.to_bytes(2, "big") + bytes([1, 0xFF]) + b.to_bytes(2, "big") + data
                head = bytes([0x11, 0x03, 0x10, 0x03]) + download.to_bytes(4, "big") + bytes([0xFF, 0]) + len(
                    ddb).to_bytes(2, "big")
                out += ts.packets(0x0200, long_section(0x3C, m, 1, head + ddb, b & 0xFF, 1))
    return out


def main():
    kind, n, path = sys.argv[1], int(sys.argv[2]), sys.argv[3]
    data = {"eit": eit, "carousel": carousel}[kind](n, Packetizer())
    with open(path, "wb") as f:
        f.write(data)


if __name__ == "__main__":
    main()

#!/usr/bin/env python3
"""Writes the 16-colour image strip that the painting tests load as a resource.

Usage: make_test_bmp.py OUTPUT.bmp

The strip holds 4 columns by 2 rows of 16 by 15 cells and 6 spare columns of
dark green at the right (70 by 30 pixels), so a test sees the column count
truncate. Every cell, in cell coordinates from the top left:

    background      light grey (key colour of the button face)
    (1..2, 1..2)    pure red, no key colour
    (4..11, 3..8)   black ink (key colour of button text)
    (4..11, 10)     white (key colour of the light edge)
    (4..11, 11)     grey (key colour of the dark edge)
    (n, 13)         pure blue in cell n: tells the cells apart

Spare column 68 is light grey with a non-zero reserved byte in its colour-table
entry: no key colour, since a key is the whole entry.
"""
import struct
import sys

# The 16 colours of the classic VGA palette, as (red, green, blue).
PALETTE = [
    (0x00, 0x00, 0x00), (0x80, 0x00, 0x00), (0x00, 0x80, 0x00), (0x80, 0x80, 0x00),
    (0x00, 0x00, 0x80), (0x80, 0x00, 0x80), (0x00, 0x80, 0x80), (0xC0, 0xC0, 0xC0),
    (0x80, 0x80, 0x80), (0xFF, 0x00, 0x00), (0x00, 0xFF, 0x00), (0xFF, 0xFF, 0x00),
    (0x00, 0x00, 0xFF), (0xFF, 0x00, 0xFF), (0x00, 0xFF, 0xFF), (0xFF, 0xFF, 0xFF),
]
BLACK, DARK_GREEN, LIGHT_GREY, GREY, RED, BLUE, WHITE = 0, 2, 7, 8, 9, 12, 15
# Entry 13 (unused magenta) becomes light grey with reserved byte 1.
MARKED_GREY = 13
RESERVED = {MARKED_GREY: 1}
PALETTE[MARKED_GREY] = PALETTE[LIGHT_GREY]

CELL_W, CELL_H = 16, 15
COLUMNS, ROWS = 4, 2
SPARE = 6
WIDTH, HEIGHT = COLUMNS * CELL_W + SPARE, ROWS * CELL_H


def cell_pixel(n, x, y):
    if 1 <= x <= 2 and 1 <= y <= 2:
        return RED
    if 4 <= x <= 11 and 3 <= y <= 8:
        return BLACK
    if 4 <= x <= 11 and y == 10:
        return WHITE
    if 4 <= x <= 11 and y == 11:
        return GREY
    if y == 13 and x == n:
        return BLUE
    return LIGHT_GREY


def pixel(x, y):
    if x == COLUMNS * CELL_W + 4:
        return MARKED_GREY
    if x >= COLUMNS * CELL_W:
        return DARK_GREEN
    column, row = x // CELL_W, y // CELL_H
    return cell_pixel(row * COLUMNS + column, x % CELL_W, y % CELL_H)


def main():
    if len(sys.argv) != 2:
        sys.exit(__doc__)
    stride = ((WIDTH * 4 + 31) // 32) * 4
    rows = []
    for y in reversed(range(HEIGHT)):  # a DIB is stored bottom-up
        values = [pixel(x, y) for x in range(WIDTH)] + [0]
        packed = bytes((values[i] << 4) | values[i + 1] for i in range(0, WIDTH, 2))
        rows.append(packed.ljust(stride, b"\0"))
    bits = b"".join(rows)
    table = b"".join(struct.pack("<BBBB", b, g, r, RESERVED.get(i, 0)) for i, (r, g, b) in enumerate(PALETTE))
    info = struct.pack("<IiiHHIIiiII", 40, WIDTH, HEIGHT, 1, 4, 0, len(bits), 0, 0, 0, 0)
    offset = 14 + len(info) + len(table)
    header = struct.pack("<2sIHHI", b"BM", offset + len(bits), 0, 0, offset)
    with open(sys.argv[1], "wb") as out:
        out.write(header + info + table + bits)


if __name__ == "__main__":
    main()

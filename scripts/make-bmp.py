#!/usr/bin/env python3
"""Turn a text picture (demo/images/*.txt) into a 16-colour uncompressed BMP strip or a 16-colour .ico."""
#
# Usage:  make-bmp.py [--scale PERCENT] PICTURE.txt OUTPUT.bmp
#         make-bmp.py PICTURE.txt OUTPUT.ico
#
# --scale draws the strip for a display scale: every cell becomes
# W*PERCENT/100 by H*PERCENT/100 pixels (rounded half up, as the library
# scales its image size), each pixel taken from the nearest pixel of the
# picture, so the images stay sharp and keep exactly the picture's colours.
# The demo ships main_150.bmp and main_200.bmp made this way from main.txt.
#
# The picture file is plain text, one directive per line; '#' starts a comment
# line and blank lines are ignored:
#
#   cell W H            size of one image in pixels (default 16 15)
#   columns N           images per row of the strip
#   rows N              rows of images in the strip
#   colour C RRGGBB     the character C stands for that colour (16 colours at most)
#   background C        the character that fills cells without an image
#   transparent C       (icons only) pixels of C are transparent
#   images FILE         take the colours and images of another picture file
#   order NAME ...      lay out these images, by name, instead of the file order
#   image NAME [words]  an image follows: H lines of W characters each
#
# Images are laid left to right, top to bottom; cells left over are filled with
# the background. Toolbar strips must use exactly 000000, 808080, C0C0C0 and
# FFFFFF for ink, shadow, face and highlight: the library maps those four to the
# system colours when it loads a strip, and any near miss would stay grey.
import os
import struct
import sys


class Picture:
    def __init__(self):
        self.cell = (16, 15)
        self.columns = 1
        self.rows = 1
        self.colours = {}          # character -> (r, g, b)
        self.background = None
        self.transparent = None
        self.images = {}           # name -> list of row strings
        self.names = []            # file order
        self.order = None


def fail(path, line_no, message):
    sys.exit(f"{path}:{line_no}: {message}")


def read_picture(path, picture=None):
    picture = picture or Picture()
    with open(path, encoding="ascii") as f:
        lines = f.read().splitlines()
    i = 0
    while i < len(lines):
        line = lines[i]
        i += 1
        words = line.split()
        if not words or line.lstrip().startswith("#"):
            continue
        key = words[0]
        if key == "cell":
            picture.cell = (int(words[1]), int(words[2]))
        elif key == "columns":
            picture.columns = int(words[1])
        elif key == "rows":
            picture.rows = int(words[1])
        elif key == "colour":
            value = int(words[2], 16)
            picture.colours[words[1]] = ((value >> 16) & 255, (value >> 8) & 255, value & 255)
        elif key == "background":
            picture.background = words[1]
        elif key == "transparent":
            picture.transparent = words[1]
        elif key == "images":
            other = read_picture(os.path.join(os.path.dirname(path), words[1]))
            picture.colours.update(other.colours)
            picture.images.update(other.images)
            picture.names += other.names
            if picture.background is None:
                picture.background = other.background
        elif key == "order":
            picture.order = (picture.order or []) + words[1:]
        elif key == "image":
            name = words[1]
            width, height = picture.cell
            rows = lines[i:i + height]
            if len(rows) != height:
                fail(path, i, f"image {name}: needs {height} rows")
            for n, row in enumerate(rows):
                if len(row) != width:
                    fail(path, i + n + 1, f"image {name}: row is {len(row)} characters, not {width}")
                for c in row:
                    if c not in picture.colours and c != picture.transparent:
                        fail(path, i + n + 1, f"image {name}: unknown colour character {c!r}")
            if name in picture.images and name in picture.names:
                fail(path, i, f"image {name} given twice")
            picture.images[name] = rows
            picture.names.append(name)
            i += height
        else:
            fail(path, i, f"unknown directive {key!r}")
    return picture


def palette_of(picture):
    """Distinct colours in the order they were declared, padded to 16."""
    palette = []
    for rgb in picture.colours.values():
        if rgb not in palette:
            palette.append(rgb)
    if len(palette) > 16:
        sys.exit(f"{len(palette)} colours; a 4 bpp picture holds 16")
    return palette + [(0, 0, 0)] * (16 - len(palette))


def scaled_size(value, percent):
    """value * percent / 100, halves rounded up (what MulDiv gives for sizes)."""
    return (value * percent * 2 + 100) // 200


def scale_picture(picture, percent):
    """The picture with every image redrawn for a display scale, pixel by
    nearest pixel."""
    width, height = picture.cell
    new_width, new_height = scaled_size(width, percent), scaled_size(height, percent)
    for name, rows in picture.images.items():
        picture.images[name] = [
            "".join(rows[y * height // new_height][x * width // new_width] for x in range(new_width))
            for y in range(new_height)
        ]
    picture.cell = (new_width, new_height)
    return picture


def compose(picture):
    """The whole picture as rows of characters, top row first."""
    width, height = picture.cell
    order = picture.order or picture.names
    if len(order) > picture.columns * picture.rows:
        sys.exit(f"{len(order)} images do not fit {picture.columns} x {picture.rows} cells")
    fill = picture.background or next(iter(picture.colours))
    canvas = [[fill] * (width * picture.columns) for _ in range(height * picture.rows)]
    for n, name in enumerate(order):
        if name not in picture.images:
            sys.exit(f"no image named {name}")
        x0, y0 = (n % picture.columns) * width, (n // picture.columns) * height
        for y, row in enumerate(picture.images[name]):
            canvas[y0 + y][x0:x0 + width] = list(row)
    return canvas


def pack_4bpp(canvas, index_of):
    """Bottom-up 4 bpp rows, each padded to a multiple of four bytes."""
    out = bytearray()
    for row in reversed(canvas):
        indices = [index_of(c) for c in row]
        if len(indices) % 2:
            indices.append(0)
        line = bytes((indices[k] << 4) | indices[k + 1] for k in range(0, len(indices), 2))
        out += line + b"\0" * (-len(line) % 4)
    return bytes(out)


def info_header(width, height, bits, image_size):
    return struct.pack("<IiiHHIIiiII", 40, width, height, 1, bits, 0, image_size, 2835, 2835, 16 if bits == 4 else 2, 0)


def palette_bytes(palette):
    return b"".join(struct.pack("<BBBB", b, g, r, 0) for r, g, b in palette)


def write_bmp(picture, path):
    canvas = compose(picture)
    palette = palette_of(picture)
    index_of = lambda c: palette.index(picture.colours[c])
    pixels = pack_4bpp(canvas, index_of)
    width, height = len(canvas[0]), len(canvas)
    header = info_header(width, height, 4, len(pixels)) + palette_bytes(palette)
    offset = 14 + len(header)
    with open(path, "wb") as f:
        f.write(struct.pack("<2sIHHI", b"BM", offset + len(pixels), 0, 0, offset))
        f.write(header + pixels)


def write_ico(picture, path):
    canvas = compose(picture)
    palette = palette_of(picture)
    transparent = picture.transparent
    # A transparent pixel is black in the colour bits and set in the mask, so
    # the screen shows through unchanged.
    index_of = lambda c: 0 if c == transparent else palette.index(picture.colours[c])
    colour_bits = pack_4bpp(canvas, index_of)
    width, height = len(canvas[0]), len(canvas)
    mask = bytearray()
    for row in reversed(canvas):
        bits = 0
        line = bytearray()
        for x, c in enumerate(row):
            bits = (bits << 1) | (c == transparent)
            if x % 8 == 7:
                line.append(bits)
                bits = 0
        if width % 8:
            line.append(bits << (8 - width % 8))
        mask += line + b"\0" * (-len(line) % 4)
    # The icon's own header counts the colour and mask rows together.
    image = info_header(width, height * 2, 4, len(colour_bits) + len(mask)) + palette_bytes(palette)
    image += colour_bits + bytes(mask)
    with open(path, "wb") as f:
        f.write(struct.pack("<HHH", 0, 1, 1))
        f.write(struct.pack("<BBBBHHII", width % 256, height % 256, 16, 0, 1, 4, len(image), 6 + 16))
        f.write(image)


def main(argv):
    percent = 100
    if len(argv) == 5 and argv[1] == "--scale":
        percent = int(argv[2])
        argv = argv[:1] + argv[3:]
    if len(argv) != 3 or percent < 100:
        sys.exit("usage: make-bmp.py [--scale PERCENT] PICTURE.txt OUTPUT.bmp|OUTPUT.ico")
    picture = read_picture(argv[1])
    if percent != 100:
        scale_picture(picture, percent)
    if argv[2].lower().endswith(".ico"):
        write_ico(picture, argv[2])
    else:
        write_bmp(picture, argv[2])


if __name__ == "__main__":
    main(sys.argv)

#!/usr/bin/env python3
"""Draws the panning dialog's pictures as 16-colour BMP files in resources/.

The arrow pad (168 x 168): four raised triangular arrows around a square
AUTO button on grey, one picture per pressed element. Its bands must match
the dialog's hit regions (src/adjust/panning_dialog.cpp): Up and Down
between x 50 and 124, above y 47 and from y 116; Left below x 50, Right
from x 125 and AUTO between them, in the middle band.

The corner picture (48 x 44): a monitor with four arrows on its screen.

Run from anywhere: python3 tools/make_adjust_bitmaps.py
"""
import math
import os
import struct

# The VGA's sixteen colours, in the order Windows uses for 4-bit bitmaps.
PALETTE = [
    (0, 0, 0), (128, 0, 0), (0, 128, 0), (128, 128, 0),
    (0, 0, 128), (128, 0, 128), (0, 128, 128), (192, 192, 192),
    (128, 128, 128), (255, 0, 0), (0, 255, 0), (255, 255, 0),
    (0, 0, 255), (255, 0, 255), (0, 255, 255), (255, 255, 255),
]
BLACK, DARK_GREEN, DARK_BLUE, TEAL, GREY, DARK_GREY = 0, 2, 4, 6, 7, 8
GREEN, YELLOW, WHITE = 10, 11, 15

PAD = 168
TOP_END, BOTTOM_START, LEFT_END, RIGHT_START = 47, 116, 50, 125
CENTRE_X = (LEFT_END + RIGHT_START - 1) / 2 + 0.5   # middle of the AUTO column
CENTRE_Y = (TOP_END + BOTTOM_START - 1) / 2 + 0.5   # middle of the middle band
MARGIN = 5        # between an arrow and the edge of its band
ARROW_HALF = 27   # half the width of an arrow's base
BEVEL = 2.5

LETTERS = {
    "A": [".##.", "#..#", "#..#", "####", "#..#", "#..#", "#..#"],
    "U": ["#..#", "#..#", "#..#", "#..#", "#..#", "#..#", ".##."],
    "T": ["####", ".##.", ".##.", ".##.", ".##.", ".##.", ".##."],
    "O": [".##.", "#..#", "#..#", "#..#", "#..#", "#..#", ".##."],
}


class Canvas:
    def __init__(self, width, height, colour):
        self.width, self.height = width, height
        self.pixels = [[colour] * width for _ in range(height)]

    def put(self, x, y, colour):
        if 0 <= x < self.width and 0 <= y < self.height:
            self.pixels[y][x] = colour

    def fill_rect(self, left, top, right, bottom, colour):
        for y in range(top, bottom):
            for x in range(left, right):
                self.put(x, y, colour)

    def frame_rect(self, left, top, right, bottom, colour):
        for x in range(left, right):
            self.put(x, top, colour)
            self.put(x, bottom - 1, colour)
        for y in range(top, bottom):
            self.put(left, y, colour)
            self.put(right - 1, y, colour)

    def polygon(self, points, face, raised=True, bevel=BEVEL):
        """A convex polygon lit from the top left; sunken when not raised."""
        edges = []
        n = len(points)
        area = sum(points[i][0] * points[(i + 1) % n][1] - points[(i + 1) % n][0] * points[i][1] for i in range(n))
        for i in range(n):
            (x1, y1), (x2, y2) = points[i], points[(i + 1) % n]
            length = math.hypot(x2 - x1, y2 - y1)
            # Inward normal, whichever way round the points go.
            nx, ny = -(y2 - y1) / length, (x2 - x1) / length
            if area < 0:
                nx, ny = -nx, -ny
            lit = (nx + ny) > 0  # the outward normal, -n, faces up or left
            edges.append((x1, y1, nx, ny, lit))
        xs = [p[0] for p in points]
        ys = [p[1] for p in points]
        for y in range(int(min(ys)) - 1, int(max(ys)) + 2):
            for x in range(int(min(xs)) - 1, int(max(xs)) + 2):
                px, py = x + 0.5, y + 0.5
                nearest, nearest_lit = None, False
                for x1, y1, nx, ny, lit in edges:
                    d = (px - x1) * nx + (py - y1) * ny
                    if nearest is None or d < nearest:
                        nearest, nearest_lit = d, lit
                if nearest < 0:
                    continue
                colour = face
                if nearest < bevel:
                    light = nearest_lit == raised
                    if light:
                        colour = WHITE
                    else:
                        colour = BLACK if nearest < 1 else DARK_GREY
                self.put(x, y, colour)

    def text(self, word, left, top, scale, gap, colour):
        x = left
        for letter in word:
            rows = LETTERS[letter]
            for row, line in enumerate(rows):
                for column, mark in enumerate(line):
                    if mark == "#":
                        self.fill_rect(x + column * scale, top + row * scale,
                                       x + (column + 1) * scale, top + (row + 1) * scale, colour)
            x += len(rows[0]) * scale + gap

    def bmp(self):
        """The picture as a 4-bit bitmap file, run-length encoded (BI_RLE4):
        flat pictures shrink to a fraction, and LoadBitmap expands them."""
        bits = bytearray()
        for y in reversed(range(self.height)):
            line = self.pixels[y]
            x = 0
            while x < self.width:
                colour = line[x]
                run = 1
                while x + run < self.width and line[x + run] == colour and run < 255:
                    run += 1
                bits += bytes((run, (colour << 4) | colour))
                x += run
            bits += b"\0\0"          # end of line
        bits += b"\0\1"              # end of bitmap
        palette = b"".join(struct.pack("<BBBB", b, g, r, 0) for r, g, b in PALETTE)
        offset = 14 + 40 + len(palette)
        bi_rle4 = 2
        info = struct.pack("<IiiHHIIiiII", 40, self.width, self.height, 1, 4, bi_rle4, len(bits), 2835, 2835, 16, 16)
        header = struct.pack("<2sIHHI", b"BM", offset + len(bits), 0, 0, offset)
        return header + info + palette + bytes(bits)


def arrow_points(element):
    cx, cy = CENTRE_X, CENTRE_Y
    h = ARROW_HALF
    if element == "up":
        return [(cx, MARGIN), (cx + h, TOP_END - MARGIN), (cx - h, TOP_END - MARGIN)]
    if element == "down":
        return [(cx - h, BOTTOM_START + MARGIN), (cx + h, BOTTOM_START + MARGIN), (cx, PAD - MARGIN - 4)]
    if element == "left":
        return [(MARGIN, cy), (LEFT_END - MARGIN, cy - h), (LEFT_END - MARGIN, cy + h)]
    return [(RIGHT_START + MARGIN, cy - h), (PAD - MARGIN, cy), (RIGHT_START + MARGIN, cy + h)]


def auto_square():
    half = 31
    return (int(CENTRE_X - half), int(CENTRE_Y - half), int(CENTRE_X + half + 1), int(CENTRE_Y + half + 1))


def draw_auto(canvas, pressed):
    left, top, right, bottom = auto_square()
    square = [(left, top), (right, top), (right, bottom), (left, bottom)]
    canvas.polygon(square, GREY, raised=not pressed)
    scale, gap = 2, 2
    width = 4 * 4 * scale + 3 * gap
    shift = 1 if pressed else 0
    label_left = int(CENTRE_X - width / 2) + shift
    label_top = int(CENTRE_Y - 7 * scale / 2) + shift
    canvas.text("AUTO", label_left, label_top, scale, gap, GREEN if pressed else BLACK)
    if pressed:
        cx, cy = CENTRE_X + shift, CENTRE_Y + shift
        tip, base = 4, 5
        tips = [
            [(cx, top + 3), (cx + base, top + 3 + tip), (cx - base, top + 3 + tip)],
            [(cx - base, bottom - 3 - tip), (cx + base, bottom - 3 - tip), (cx, bottom - 3)],
            [(left + 3, cy), (left + 3 + tip, cy - base), (left + 3 + tip, cy + base)],
            [(right - 3 - tip, cy - base), (right - 3, cy), (right - 3 - tip, cy + base)],
        ]
        for points in tips:
            canvas.polygon(points, GREEN, bevel=0)


def pad(pressed):
    canvas = Canvas(PAD, PAD, GREY)
    canvas.frame_rect(0, 0, PAD, PAD, DARK_GREY)
    for element in ("up", "down", "left", "right"):
        down = element == pressed
        canvas.polygon(arrow_points(element), DARK_GREY if down else GREY, raised=not down)
    draw_auto(canvas, pressed == "auto")
    return canvas


def small_arrow(canvas, x, y, dx, dy):
    """An arrow head with its tip at (x, y), pointing along (dx, dy)."""
    for step in range(4):
        for side in range(-step, step + 1):
            if dx:
                canvas.put(x - dx * step, y + side, YELLOW)
            else:
                canvas.put(x + side, y - dy * step, YELLOW)


def corner():
    canvas = Canvas(48, 44, GREY)
    # Cabinet, screen and stand.
    canvas.polygon([(3, 1), (45, 1), (45, 34), (3, 34)], GREY)
    canvas.fill_rect(8, 5, 40, 30, DARK_BLUE)
    canvas.frame_rect(7, 4, 41, 31, DARK_GREY)
    canvas.polygon([(18, 35), (30, 35), (33, 40), (15, 40)], GREY, bevel=1.5)
    canvas.polygon([(10, 40), (38, 40), (38, 43), (10, 43)], GREY, bevel=1.5)
    # Arrows out from the middle of the screen.
    cx, cy = 24, 17
    for x in range(cx - 11, cx + 12):
        canvas.put(x, cy, YELLOW)
    for y in range(cy - 9, cy + 10):
        canvas.put(cx, y, YELLOW)
    small_arrow(canvas, cx - 13, cy, -1, 0)
    small_arrow(canvas, cx + 13, cy, 1, 0)
    small_arrow(canvas, cx, cy - 10, 0, -1)
    small_arrow(canvas, cx, cy + 10, 0, 1)
    return canvas


PICTURES = [
    ("pad_auto.bmp", lambda: pad("auto")),      # 111
    ("pad_down.bmp", lambda: pad("down")),      # 112
    ("pad_left.bmp", lambda: pad("left")),      # 113
    ("pad_normal.bmp", lambda: pad(None)),      # 114
    ("pad_right.bmp", lambda: pad("right")),    # 115
    ("pad_up.bmp", lambda: pad("up")),          # 116
    ("panning.bmp", corner),                    # 137
]


def main():
    folder = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "resources")
    for name, draw in PICTURES:
        with open(os.path.join(folder, name), "wb") as out:
            out.write(draw().bmp())


if __name__ == "__main__":
    main()

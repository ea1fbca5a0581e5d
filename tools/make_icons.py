#!/usr/bin/env python3
"""Draws the program's icons as .ico files in resources/.

Each icon holds a 32 x 32 and a 16 x 16 picture in the sixteen VGA colours
(4 bits a pixel); the background is transparent through the AND mask. Both
sizes come from one design on a 32-unit grid (tools/pixels.py); a design
branches on the size only where the small picture needs a simpler shape.

Run from anywhere: python3 tools/make_icons.py
"""
import math
import os
import struct

from pixels import (BLACK, BLUE, CYAN, GREEN, GREY, LIME, MAGENTA, MAROON, NAVY, OLIVE, PALETTE, RED, SILVER,
                    TEAL, WHITE, YELLOW, Canvas, circle, ellipse, minus, polygon, rect, stroke, union)


# The monitor the tray, sheet, display and Monitor page icons share: a
# cabinet with a sunken screen on a small stand. Returns the screen's inside
# as (left, top, right, bottom) in design units.
def monitor(c):
    c.raised(rect(8, 25, 24, 30), SILVER)
    c.fill(rect(12, 22, 20, 26), GREY, BLACK)
    c.raised(rect(1, 2, 31, 24), SILVER)
    c.raised(rect(4, 5, 28, 21), BLACK, outline=None, sunken=True)
    if c.width == 32:
        c.dot(25, 22, LIME)
    return (6, 7, 26, 19) if c.width == 32 else (6, 6, 26, 20)


def colour_bars(c):
    """The program's own icon: a monitor showing a test pattern."""
    left, top, right, bottom = monitor(c)
    bars = [WHITE, YELLOW, CYAN, LIME, MAGENTA, RED, BLUE]
    width = (right - left) / len(bars)
    for i, colour in enumerate(bars):
        c.fill(rect(left + i * width, top, left + (i + 1) * width, bottom), colour)


def display_properties(c):
    """A monitor showing the desktop with a window on it."""
    left, top, right, bottom = monitor(c)
    c.fill(rect(left, top, right, bottom), TEAL)
    if c.width == 32:
        c.fill(rect(10, 9, 23, 17), WHITE, BLACK)
        c.fill(rect(11, 10, 22, 12), NAVY)
    else:
        c.fill(rect(10, 8, 22, 16), WHITE)
        c.fill(rect(10, 8, 22, 10), NAVY)


def monitor_page(c):
    """A monitor with arrows out from the middle of its screen (picture position)."""
    left, top, right, bottom = monitor(c)
    c.fill(rect(left, top, right, bottom), NAVY)
    cx, cy = (left + right) / 2, (top + bottom) / 2
    if c.width == 32:
        c.line(left + 3, cy - 1, right - 3, cy - 1, YELLOW)
        c.line(cx - 1, top + 1, cx - 1, bottom - 2, YELLOW)
        for dx, dy in ((-1, 0), (1, 0), (0, -1), (0, 1)):
            tip_x = cx - 1 + dx * ((right - left) / 2 - 2)
            tip_y = cy - 1 + dy * ((bottom - top) / 2 - 1)
            for step in range(1, 3):
                c.line(tip_x - dx * step - dy * step, tip_y - dy * step - dx * step,
                       tip_x - dx * step + dy * step, tip_y - dy * step + dx * step, YELLOW)
    else:
        c.fill(rect(left + 2, cy - 2, right - 2, cy), YELLOW)
        c.fill(rect(cx - 2, top + 2, cx, bottom - 2), YELLOW)


def desktop_page(c):
    """A framed picture: sky, sun, hills."""
    if c.width == 32:
        c.raised(rect(1, 4, 31, 28), OLIVE, light=YELLOW, dark=MAROON)
        left, top, right, bottom = 4, 7, 28, 25
    else:
        c.fill(rect(0, 4, 32, 28), OLIVE, BLACK)
        left, top, right, bottom = 2, 6, 30, 26
    sky = rect(left, top, right, bottom)

    def on_sky(shape):
        return lambda x, y: sky(x, y) and shape(x, y)
    c.fill(sky, CYAN)
    c.fill(on_sky(circle(22, top + 5, 3.5)), YELLOW)
    c.fill(on_sky(ellipse(11, top + 4, 4.5, 2)), WHITE)
    c.fill(on_sky(ellipse(9, bottom + 4, 12, 10)), GREEN)
    c.fill(on_sky(ellipse(24, bottom + 6, 11, 9)), LIME)


def adapter(c):
    """A graphics card: board, chip, edge connector and bracket."""
    if c.width == 32:
        c.fill(rect(5, 6, 30, 23), GREEN, BLACK)
        c.fill(rect(9, 23, 27, 27), YELLOW, BLACK)
        for x in range(11, 26, 2):
            c.line(x, 23, x, 25, OLIVE)
        c.raised(rect(1, 3, 5, 30), SILVER)
        for x in range(13, 24, 2):
            c.line(x, 8, x, 20, SILVER)
        for y in range(10, 19, 2):
            c.line(11, y, 25, y, SILVER)
        c.fill(rect(13, 10, 24, 19), BLACK)
        c.line(14, 11, 22, 11, GREY)
        c.fill(rect(25, 9, 28, 14), NAVY)
        c.fill(rect(7, 17, 10, 20), NAVY)
    else:
        c.fill(rect(4, 6, 32, 24), GREEN, BLACK)
        c.fill(rect(10, 24, 28, 28), YELLOW)
        c.fill(rect(0, 2, 4, 30), SILVER, BLACK)
        c.fill(rect(12, 10, 24, 20), BLACK)


def power(c):
    """A crescent moon with sleeping z's."""
    c.raised(minus(circle(13, 17, 12), circle(21, 11, 10)), YELLOW, light=WHITE, dark=OLIVE)
    if c.width == 32:
        for left, top, size in ((16, 9, 6), (25, 3, 4)):
            c.line(left, top, left + size, top, NAVY)
            c.line(left + size, top, left, top + size, NAVY)
            c.line(left, top + size, left + size, top + size, NAVY)
    else:
        c.fill(rect(18, 4, 28, 6), NAVY)
        c.fill(rect(18, 12, 28, 14), NAVY)
        c.line(26, 6, 20, 12, NAVY)


def zoom(c):
    """A magnifying glass."""
    c.fill(stroke([(19, 19), (28, 28)], 6.5), BLACK)
    c.fill(stroke([(20, 20), (27, 27)], 3.5), MAROON)
    c.fill(circle(12, 12, 10.5), SILVER, BLACK)
    c.fill(circle(12, 12, 7.5), WHITE, GREY if c.width == 32 else None)
    c.fill(lambda x, y: circle(12, 12, 6)(x, y) and not circle(13.5, 13.5, 6)(x, y), CYAN)


def close(c):
    """A red X."""
    c.raised(union(stroke([(6, 6), (26, 26)], 7), stroke([(26, 6), (6, 26)], 7)),
             RED, light=WHITE, dark=MAROON)


def minimize(c):
    """The minimize button: a raised square with a bar at its bottom."""
    c.raised(rect(2, 4, 30, 28), SILVER)
    if c.width == 32:
        c.fill(rect(8, 20, 20, 23), BLACK)
    else:
        c.fill(rect(8, 20, 22, 22), BLACK)


def information(c):
    """A white i on a blue disc."""
    c.raised(circle(16, 16, 14.5), BLUE, light=CYAN, dark=NAVY)
    if c.width == 32:
        c.fill(circle(16, 8.5, 2.5), WHITE)
        c.fill(rect(14, 13, 18, 24), WHITE)
        c.fill(rect(12, 13, 14, 15), WHITE)
        c.fill(rect(12, 23, 20, 25), WHITE)
    else:
        c.fill(rect(14, 6, 18, 10), WHITE)
        c.fill(rect(14, 12, 18, 26), WHITE)


def performance(c):
    """A speed gauge: coloured scale, needle towards the top right."""
    cx, cy = 16, 19
    face = minus(circle(cx, cy, 14.5), rect(0, cy + 7, 32, 32))
    c.raised(face, WHITE, light=WHITE, dark=SILVER)

    def band(start, end):
        def inside(x, y):
            r = math.hypot(x - cx, y - cy)
            a = math.degrees(math.atan2(cy - y, x - cx))
            return 8.5 <= r <= 12.5 and start <= a <= end
        return inside
    c.fill(band(-20, 60), RED)
    c.fill(band(60, 120), YELLOW)
    c.fill(band(120, 200), LIME)
    c.fill(stroke([(cx, cy), (cx + 9, cy - 9)], 2.2 if c.width == 32 else 2.5), BLACK)
    c.fill(circle(cx, cy, 2.5), BLACK)


def directx(c):
    """A cube with an X on its lit side."""
    top = [(16, 2), (30, 9), (16, 16), (2, 9)]
    left = [(2, 9), (16, 16), (16, 30), (2, 23)]
    right = [(16, 16), (30, 9), (30, 23), (16, 30)]
    c.fill(polygon(top), YELLOW)
    c.fill(polygon(left), RED)
    c.fill(polygon(right), MAROON)
    outline = c.border(c.region(polygon([(16, 2), (30, 9), (30, 23), (16, 30), (2, 23), (2, 9)])))
    c.paint(outline, BLACK)
    if c.width == 32:
        c.line(2, 9, 16, 16, BLACK)
        c.line(16, 16, 30, 9, BLACK)
        c.line(16, 16, 16, 29, BLACK)
        c.fill(union(stroke([(5, 15), (13, 25)], 2.2), stroke([(13, 16), (5, 24)], 2.2)), WHITE)
    else:
        c.fill(union(stroke([(6, 15), (12, 25)], 2), stroke([(12, 15), (6, 25)], 2)), WHITE)


def resolution(c):
    """Two rulers at a right angle."""
    horizontal = rect(1, 21, 31, 29)
    vertical = rect(1, 2, 9, 29)
    c.raised(vertical, YELLOW, light=WHITE, dark=OLIVE)
    c.raised(horizontal, YELLOW, light=WHITE, dark=OLIVE)
    if c.width == 32:
        for i, x in enumerate(range(11, 30, 3)):
            c.line(x, 21, x, 23 if i % 2 else 25, BLACK)
        for i, y in enumerate(range(18, 3, -3)):
            c.line(8, y, 6 if i % 2 else 4, y, BLACK)
    else:
        for x in range(12, 30, 4):
            c.dot(x, 22, BLACK)
        for y in range(16, 3, -4):
            c.dot(7, y, BLACK)


def colour(c):
    """A painter's palette with its thumb hole and five paints."""
    c.raised(minus(ellipse(16, 16, 15, 12), circle(10, 21, 3)), WHITE, light=WHITE, dark=SILVER)
    spots = [(8, 12, RED), (14, 8, YELLOW), (21, 8, LIME), (26, 14, BLUE), (21, 22, MAGENTA)]
    for x, y, paint in spots:
        c.fill(circle(x, y, 3), paint, BLACK if c.width == 32 else None)


def letter_a(left, bottom, height, width):
    apex = (left + width / 2, bottom - height)
    legs = stroke([(left + width * 0.1, bottom - 1), apex, (left + width * 0.9, bottom - 1)], width / 4)
    bar = stroke([(left + width * 0.3, bottom - height * 0.35), (left + width * 0.7, bottom - height * 0.35)],
                 width / 5)
    return union(legs, bar)


def font_size(c):
    """A large and a small A."""
    c.fill(letter_a(1, 30, 26, 20), NAVY)
    c.fill(letter_a(19, 30, 14, 12), BLACK)


def refresh(c):
    """A wave over the letters Hz."""
    if c.width == 32:
        wave = [(x / 2, 7 - 4 * math.sin(x / 2 / 5 * math.pi)) for x in range(4, 59)]
        c.fill(stroke(wave, 2.2), RED)
        c.fill(union(rect(2, 14, 6, 30), rect(12, 14, 16, 30), rect(6, 20, 12, 24)), BLACK)
        c.fill(union(rect(18, 18, 30, 21), rect(18, 27, 30, 30),
                     polygon([(25, 21), (30, 21), (23, 27), (18, 27)])), BLACK)
    else:
        wave = [(x / 2, 6 - 4 * math.sin(x / 2 / 7 * math.pi)) for x in range(2, 61)]
        c.fill(stroke(wave, 2.5), RED)
        c.fill(union(rect(2, 14, 5, 30), rect(12, 14, 15, 30), rect(5, 20, 12, 23)), BLACK)
        c.fill(union(rect(18, 18, 30, 20), rect(18, 28, 30, 30), polygon([(26, 20), (30, 20), (22, 28), (18, 28)])),
               BLACK)


# File name, drawing; vistrel.rc gives each file its resource id.
ICONS = [
    ("vistrel.ico", colour_bars),               # 103 tray, 147 sheet
    ("display.ico", display_properties),        # 201
    ("directx.ico", directx),                   # 202
    ("minimize.ico", minimize),                 # 207
    ("close.ico", close),                       # 209
    ("zoom.ico", zoom),                         # 210, also loupe.exe's own
    ("power.ico", power),                       # 211
    ("adapter.ico", adapter),                   # 155
    ("desktop.ico", desktop_page),              # 220
    ("information.ico", information),           # 221
    ("monitor.ico", monitor_page),              # 222
    ("performance.ico", performance),           # 223
    ("resolution.ico", resolution),             # 152
    ("colour.ico", colour),                     # 150
    ("fontsize.ico", font_size),                # 153
    ("refresh.ico", refresh),                   # 200
]
SIZES = (32, 16)


def draw(design, size):
    canvas = Canvas(size)
    design(canvas)
    return canvas


def icon_image(canvas):
    """One picture of an .ico: header, palette, colour rows, mask rows, bottom row first."""
    size = canvas.width
    colour_row = (size // 2 + 3) & ~3
    mask_row = ((size + 31) // 32) * 4
    colours = bytearray()
    mask = bytearray()
    for row in reversed(canvas.pixels):
        line = bytearray(colour_row)
        bits = bytearray(mask_row)
        for x, index in enumerate(row):
            if index is None:
                bits[x // 8] |= 0x80 >> (x % 8)
                index = 0
            line[x // 2] |= index << (4 if x % 2 == 0 else 0)
        colours += line
        mask += bits
    header = struct.pack("<IiiHHIIiiII", 40, size, 2 * size, 1, 4, 0, len(colours) + len(mask), 0, 0, 16, 0)
    palette = b"".join(struct.pack("<BBBB", b, g, r, 0) for r, g, b in PALETTE)
    return header + palette + bytes(colours) + bytes(mask)


def ico(design):
    images = [icon_image(draw(design, size)) for size in SIZES]
    out = struct.pack("<HHH", 0, 1, len(images))
    offset = 6 + 16 * len(images)
    for size, image in zip(SIZES, images):
        out += struct.pack("<BBBBHHII", size, size, 16, 0, 1, 4, len(image), offset)
        offset += len(image)
    return out + b"".join(images)


def main():
    folder = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "resources")
    for name, design in ICONS:
        with open(os.path.join(folder, name), "wb") as out:
            out.write(ico(design))


if __name__ == "__main__":
    main()

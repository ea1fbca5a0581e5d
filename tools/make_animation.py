#!/usr/bin/env python3
"""Draws the animation every property page plays: resources/pages.avi.

A monitor, 48 x 48 pixels, whose electron beam sweeps down its screen and
leaves a fading trace, in ten frames at ten frames a second, looped by the
page. The file is what the animation control plays from a resource on
every Windows since 95: one video stream of 8-bit frames compressed with
BI_RLE8, no sound, every frame a key frame, with an index.

The animation control takes the colour of the first frame's top-left pixel
as transparent (ACS_TRANSPARENT), so the background is the dialog grey and
nothing else in the picture uses that exact colour.

Run from anywhere: python3 tools/make_animation.py
"""
import os
import struct

from pixels import Canvas, rect

SIZE = 48
FRAMES = 10
MICROSECONDS_PER_FRAME = 100000

# Palette: the background first, then only colours of the 20 static system
# colours, which a 256-colour screen shows unchanged.
COLOURS = [
    (192, 192, 192),  # background, made transparent by the control
    (0, 0, 0),
    (128, 128, 128),
    (160, 160, 164),  # shadow on the cabinet
    (255, 251, 240),  # cabinet
    (255, 255, 255),
    (0, 0, 128),      # screen
    (0, 128, 128),    # old trace
    (0, 255, 255),    # fresh trace
    (0, 255, 0),      # lamp lit
    (0, 128, 0),      # lamp dark
]
BACKGROUND, BLACK, GREY, SHADOW, CABINET, WHITE, SCREEN, OLD_TRACE, TRACE, LAMP_ON, LAMP_OFF = range(len(COLOURS))

SCREEN_LEFT, SCREEN_TOP, SCREEN_RIGHT, SCREEN_BOTTOM = 9, 8, 39, 30


def frame(number):
    c = Canvas(SIZE, background=BACKGROUND, design=SIZE)
    c.raised(rect(14, 41, 34, 46), CABINET, light=WHITE, dark=SHADOW, outline=BLACK)
    c.fill(rect(19, 37, 29, 42), SHADOW, BLACK)
    c.raised(rect(3, 3, 45, 38), CABINET, light=WHITE, dark=SHADOW, outline=BLACK)
    c.raised(rect(SCREEN_LEFT - 2, SCREEN_TOP - 2, SCREEN_RIGHT + 2, SCREEN_BOTTOM + 2), SCREEN,
             light=WHITE, dark=GREY, outline=GREY, sunken=True)
    c.fill(rect(37, 33, 40, 35), LAMP_ON if number % 2 == 0 else LAMP_OFF)
    # The beam comes down two lines a frame; the lines it passed glow for a while.
    rows = SCREEN_BOTTOM - SCREEN_TOP
    beam = SCREEN_TOP + number * rows // FRAMES
    for age, colour in ((0, WHITE), (1, TRACE), (2, TRACE), (3, OLD_TRACE), (4, OLD_TRACE), (5, OLD_TRACE)):
        y = beam - age
        if y < SCREEN_TOP:
            y += rows
        c.fill(rect(SCREEN_LEFT, y, SCREEN_RIGHT, y + 1), colour)
    return c


def rle8(canvas):
    """BI_RLE8: runs of one colour, bottom line first, each line ended, then
    the end of the picture."""
    out = bytearray()
    for line in reversed(canvas.pixels):
        x = 0
        while x < len(line):
            run = 1
            while x + run < len(line) and line[x + run] == line[x] and run < 255:
                run += 1
            out += bytes((run, line[x]))
            x += run
        out += b"\0\0"
    out += b"\0\1"
    return bytes(out)


def chunk(fourcc, data):
    return fourcc + struct.pack("<I", len(data)) + data + (b"\0" if len(data) % 2 else b"")


def riff_list(kind, fourcc, data):
    return kind + struct.pack("<I", len(data) + 4) + fourcc + data


def avi(frames):
    largest = max(len(f) for f in frames)
    bi_rle8 = 1
    palette = b"".join(struct.pack("<BBBB", b, g, r, 0) for r, g, b in COLOURS)
    # biSizeImage is read as the length of every frame: the largest, as each
    # frame ends with its own end-of-picture code.
    format_ = struct.pack("<IiiHHIIiiII", 40, SIZE, SIZE, 1, 8, bi_rle8, largest, 0, 0,
                          len(COLOURS), len(COLOURS)) + palette
    avif_hasindex = 0x10
    main = struct.pack("<14I", MICROSECONDS_PER_FRAME, largest * 1000000 // MICROSECONDS_PER_FRAME, 0,
                       avif_hasindex, len(frames), 0, 1, largest, SIZE, SIZE, 0, 0, 0, 0)
    stream = struct.pack("<4s4sIHHIIIIIIII4h", b"vids", b"RLE ", 0, 0, 0, 0, 1,
                         1000000 // MICROSECONDS_PER_FRAME, 0, len(frames), largest, 0xFFFFFFFF, 0,
                         0, 0, SIZE, SIZE)
    header = riff_list(b"LIST", b"hdrl", chunk(b"avih", main) +
                       riff_list(b"LIST", b"strl", chunk(b"strh", stream) + chunk(b"strf", format_)))
    movie = b""
    index = b""
    avif_keyframe = 0x10
    for f in frames:
        # Index offsets count from the "movi" type field.
        index += struct.pack("<4sIII", b"00dc", avif_keyframe, 4 + len(movie), len(f))
        movie += chunk(b"00dc", f)
    body = header + riff_list(b"LIST", b"movi", movie) + chunk(b"idx1", index)
    return riff_list(b"RIFF", b"AVI ", body)


def main():
    path = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "resources", "pages.avi")
    with open(path, "wb") as out:
        out.write(avi([rle8(frame(n)) for n in range(FRAMES)]))


if __name__ == "__main__":
    main()

"""Pixel drawing for the generated icons and animation (standard library only).

A shape is a test "is this point inside?" in design coordinates, a grid of
32 x 32 units whatever the picture's size: the same design drawn into a
16 x 16 picture samples every second unit. A pixel belongs to a shape when
its centre does, so outlines stay one pixel wide at every size.
"""
import math

# The VGA's sixteen colours, in the order Windows uses for 4-bit pictures.
PALETTE = [
    (0, 0, 0), (128, 0, 0), (0, 128, 0), (128, 128, 0),
    (0, 0, 128), (128, 0, 128), (0, 128, 128), (192, 192, 192),
    (128, 128, 128), (255, 0, 0), (0, 255, 0), (255, 255, 0),
    (0, 0, 255), (255, 0, 255), (0, 255, 255), (255, 255, 255),
]
(BLACK, MAROON, GREEN, OLIVE, NAVY, PURPLE, TEAL, SILVER,
 GREY, RED, LIME, YELLOW, BLUE, MAGENTA, CYAN, WHITE) = range(16)

DESIGN = 32


# Shapes. Coordinates are design units; rectangles are half-open, so
# rect(2, 2, 30, 23) covers the unit squares 2..29 and 2..22.
def rect(left, top, right, bottom):
    return lambda x, y: left <= x < right and top <= y < bottom


def ellipse(cx, cy, rx, ry):
    return lambda x, y: ((x - cx) / rx) ** 2 + ((y - cy) / ry) ** 2 <= 1.0


def circle(cx, cy, r):
    return ellipse(cx, cy, r, r)


def polygon(points):
    """Even-odd rule: any simple polygon."""
    def inside(x, y):
        hit = False
        n = len(points)
        for i in range(n):
            (x1, y1), (x2, y2) = points[i], points[(i + 1) % n]
            if (y1 > y) != (y2 > y) and x < x1 + (y - y1) * (x2 - x1) / (y2 - y1):
                hit = not hit
        return hit
    return inside


def stroke(points, width):
    """A polyline of the given width with round ends."""
    half = width / 2.0

    def near(x, y):
        for (x1, y1), (x2, y2) in zip(points, points[1:]):
            dx, dy = x2 - x1, y2 - y1
            t = 0.0 if dx == dy == 0 else max(0.0, min(1.0, ((x - x1) * dx + (y - y1) * dy) / (dx * dx + dy * dy)))
            if math.hypot(x - x1 - t * dx, y - y1 - t * dy) <= half:
                return True
        return False
    return near


def union(*shapes):
    return lambda x, y: any(s(x, y) for s in shapes)


def minus(shape, *holes):
    return lambda x, y: shape(x, y) and not any(h(x, y) for h in holes)


class Canvas:
    """Colour indices, None for a transparent pixel."""

    def __init__(self, width, height=None, background=None, design=DESIGN):
        self.width = width
        self.height = width if height is None else height
        self.scale = width / design
        self.pixels = [[background] * self.width for _ in range(self.height)]

    def region(self, shape):
        k = self.scale
        return {(x, y) for y in range(self.height) for x in range(self.width)
                if shape((x + 0.5) / k, (y + 0.5) / k)}

    def put(self, x, y, colour):
        if 0 <= x < self.width and 0 <= y < self.height:
            self.pixels[y][x] = colour

    def paint(self, pixels, colour):
        for x, y in pixels:
            self.put(x, y, colour)

    @staticmethod
    def border(pixels):
        return {(x, y) for x, y in pixels
                if not {(x - 1, y), (x + 1, y), (x, y - 1), (x, y + 1)} <= pixels}

    def fill(self, shape, colour, outline=None):
        pixels = self.region(shape)
        self.paint(pixels, colour)
        if outline is not None:
            self.paint(self.border(pixels), outline)
        return pixels

    def raised(self, shape, face, light=WHITE, dark=GREY, outline=BLACK, sunken=False):
        """Filled, outlined, and lit from the top left (from the bottom right
        when sunken): the ring inside the outline is light where the outline
        lies above or to the left of it, dark where it lies below or right."""
        pixels = self.region(shape)
        self.paint(pixels, face)
        edge = self.border(pixels)
        inner = pixels - edge
        ring = self.border(inner) if inner else set()
        if sunken:
            light, dark = dark, light
        for x, y in ring:
            if (x, y - 1) in edge or (x - 1, y) in edge:
                self.put(x, y, light)
            elif (x, y + 1) in edge or (x + 1, y) in edge:
                self.put(x, y, dark)
        if outline is not None:
            self.paint(edge, outline)
        return pixels

    def line(self, x0, y0, x1, y1, colour):
        """One pixel wide, from the unit square at (x0, y0) to the one at (x1, y1)."""
        k = self.scale
        a, b = int((x0 + 0.5) * k), int((y0 + 0.5) * k)
        c, d = int((x1 + 0.5) * k), int((y1 + 0.5) * k)
        dx, dy = abs(c - a), -abs(d - b)
        sx, sy = (1 if a < c else -1), (1 if b < d else -1)
        err = dx + dy
        while True:
            self.put(a, b, colour)
            if a == c and b == d:
                return
            e2 = 2 * err
            if e2 >= dy:
                err += dy
                a += sx
            if e2 <= dx:
                err += dx
                b += sy

    def dot(self, x, y, colour):
        """The one pixel holding the design unit (x, y)."""
        k = self.scale
        self.put(int((x + 0.5) * k), int((y + 0.5) * k), colour)


def write_png(path, width, height, rows):
    """A 24-bit PNG; rows are top to bottom, each bytes of R, G, B."""
    import struct
    import zlib

    def chunk(kind, data):
        return struct.pack(">I", len(data)) + kind + data + struct.pack(">I", zlib.crc32(kind + data))

    raw = b"".join(b"\0" + bytes(row) for row in rows)
    with open(path, "wb") as f:
        f.write(b"\x89PNG\r\n\x1a\n")
        f.write(chunk(b"IHDR", struct.pack(">IIBBBBB", width, height, 8, 2, 0, 0, 0)))
        f.write(chunk(b"IDAT", zlib.compress(raw, 9)))
        f.write(chunk(b"IEND", b""))


def read_bmp(path):
    """Width, height and top-to-bottom RGB rows of an uncompressed 24-bit BMP."""
    import struct
    with open(path, "rb") as f:
        data = f.read()
    offset, = struct.unpack_from("<I", data, 10)
    width, height, _, bits = struct.unpack_from("<iiHH", data, 18)
    if bits != 24:
        raise ValueError("%s: %d bits per pixel" % (path, bits))
    stride = (width * 3 + 3) & ~3
    rows = []
    for y in range(abs(height)):
        start = offset + y * stride
        bgr = data[start:start + width * 3]
        rgb = bytearray(len(bgr))
        rgb[0::3], rgb[1::3], rgb[2::3] = bgr[2::3], bgr[1::3], bgr[0::3]
        rows.append(rgb)
    if height > 0:
        rows.reverse()
    return width, abs(height), rows

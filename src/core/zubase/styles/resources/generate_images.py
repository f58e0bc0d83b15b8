#!/usr/bin/env python3
"""Draws the images compiled into zubase (check marks, radio dot, busy cursor, logo).

Standard library only: shapes are described as coverage tests, sampled 4 x 4 times per pixel
for smooth edges, and written as RGBA PNG files next to this script.
Run it again after changing a shape:  python3 generate_images.py
"""
import math
import os
import struct
import zlib

SS = 4  # samples per pixel and axis


def write_png(path, width, height, pixels):
    """pixels: list of rows, each a list of (r, g, b, a) tuples."""
    raw = b"".join(b"\x00" + bytes(c for px in row for c in px) for row in pixels)

    def chunk(kind, data):
        body = kind + data
        return struct.pack(">I", len(data)) + body + struct.pack(">I", zlib.crc32(body) & 0xFFFFFFFF)

    header = struct.pack(">IIBBBBB", width, height, 8, 6, 0, 0, 0)
    with open(path, "wb") as f:
        f.write(b"\x89PNG\r\n\x1a\n")
        f.write(chunk(b"IHDR", header))
        f.write(chunk(b"IDAT", zlib.compress(raw, 9)))
        f.write(chunk(b"IEND", b""))


class Canvas:
    def __init__(self, width, height):
        self.w, self.h = width, height
        self.px = [[(0, 0, 0, 0) for _ in range(width)] for _ in range(height)]

    def fill(self, inside, color):
        """Paints colour over every pixel in proportion to how much of it `inside` covers."""
        for y in range(self.h):
            for x in range(self.w):
                hits = 0
                for sy in range(SS):
                    for sx in range(SS):
                        if inside(x + (sx + 0.5) / SS, y + (sy + 0.5) / SS):
                            hits += 1
                if hits:
                    self.blend(x, y, color, hits / (SS * SS))

    def blend(self, x, y, color, coverage):
        r, g, b, a = self.px[y][x]
        sa = coverage * color[3] / 255.0
        da = a / 255.0
        oa = sa + da * (1 - sa)
        if oa <= 0:
            return
        mix = lambda s, d: int(round((s * sa + d * da * (1 - sa)) / oa))
        self.px[y][x] = (mix(color[0], r), mix(color[1], g), mix(color[2], b), int(round(oa * 255)))

    def save(self, name):
        write_png(os.path.join(os.path.dirname(os.path.abspath(__file__)), name), self.w, self.h, self.px)


def seg_dist(px, py, ax, ay, bx, by):
    dx, dy = bx - ax, by - ay
    t = max(0.0, min(1.0, ((px - ax) * dx + (py - ay) * dy) / (dx * dx + dy * dy)))
    return math.hypot(px - (ax + t * dx), py - (ay + t * dy))


def polyline(points, width):
    def inside(x, y):
        return any(seg_dist(x, y, *points[i], *points[i + 1]) <= width / 2 for i in range(len(points) - 1))
    return inside


def polygon(points):
    def inside(x, y):
        c = False
        n = len(points)
        for i in range(n):
            x1, y1 = points[i]
            x2, y2 = points[(i + 1) % n]
            if (y1 > y) != (y2 > y) and x < (x2 - x1) * (y - y1) / (y2 - y1) + x1:
                c = not c
        return c
    return inside


def circle(cx, cy, r):
    return lambda x, y: (x - cx) ** 2 + (y - cy) ** 2 <= r * r


def check_mark(color, name):
    c = Canvas(32, 32)
    c.fill(polyline([(7, 16.5), (13, 23), (25.5, 8.5)], 4.2), color)
    c.save(name)


def radio_dot():
    c = Canvas(10, 10)
    c.fill(circle(5, 5, 3.6), (52, 118, 206, 255))
    c.fill(circle(4.2, 4.2, 1.2), (255, 255, 255, 90))  # a small highlight
    c.save("RadioBoxCheck.png")


def busy_cursor():
    """An hourglass with sand running down."""
    c = Canvas(25, 37)
    outline = [(3, 1), (22, 1), (22, 6), (14.5, 18.5), (22, 31), (22, 36), (3, 36), (3, 31),
               (10.5, 18.5), (3, 6)]
    c.fill(polygon(outline), (20, 20, 20, 255))
    inner = [(5, 3), (20, 3), (20, 6.3), (13.2, 18.5), (20, 30.7), (20, 34), (5, 34), (5, 30.7),
             (11.8, 18.5), (5, 6.3)]
    c.fill(polygon(inner), (250, 250, 250, 255))
    c.fill(polygon([(8, 9), (17, 9), (12.5, 16)]), (214, 166, 72, 255))       # upper sand
    c.fill(polygon([(12.5, 26), (19, 33), (6, 33)]), (214, 166, 72, 255))     # lower heap
    c.fill(lambda x, y: 12.1 <= x <= 12.9 and 16 <= y <= 27, (214, 166, 72, 255))
    c.save("BusyCursorMac.png")


# 5 x 7 letters for the logo's word mark.
GLYPHS = {
    "T": ["#####", "..#..", "..#..", "..#..", "..#..", "..#..", "..#.."],
    "E": ["#####", "#....", "#....", "####.", "#....", "#....", "#####"],
    "S": [".####", "#....", "#....", ".###.", "....#", "....#", "####."],
    "L": ["#....", "#....", "#....", "#....", "#....", "#....", "#####"],
}


def logo():
    """Tessel 7: a tile of six triangles with a 7 cut out, then the word mark."""
    c = Canvas(113, 49)
    cx, cy, r = 22, 24.5, 21
    colors = [(33, 97, 163), (54, 132, 201), (86, 163, 221), (33, 97, 163), (54, 132, 201),
              (86, 163, 221)]
    for i in range(6):
        a0 = math.radians(60 * i - 90)
        a1 = math.radians(60 * (i + 1) - 90)
        tri = [(cx, cy), (cx + r * math.cos(a0), cy + r * math.sin(a0)),
               (cx + r * math.cos(a1), cy + r * math.sin(a1))]
        c.fill(polygon(tri), colors[i] + (255,))
    c.fill(polyline([(13, 13), (31, 13), (20, 37)], 4.5), (255, 255, 255, 255))
    x = 47
    for letter in "TESSEL":
        rows = GLYPHS[letter]
        for gy, row in enumerate(rows):
            for gx, cell in enumerate(row):
                if cell == "#":
                    x0, y0 = x + gx * 2, 14 + gy * 3
                    c.fill(lambda px, py, x0=x0, y0=y0: x0 <= px < x0 + 2 and y0 <= py < y0 + 3,
                           (54, 132, 201, 255))
        x += 11
    c.fill(lambda px, py: 47 <= px < 112 and 37 <= py < 39, (33, 97, 163, 255))
    c.save("Tessel7.png")


if __name__ == "__main__":
    check_mark((0, 0, 0, 255), "CheckBoxCheckBlack.png")
    check_mark((255, 255, 255, 255), "CheckBoxCheckWhite.png")
    radio_dot()
    busy_cursor()
    logo()

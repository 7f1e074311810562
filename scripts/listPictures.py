#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
# Makes the pictures of docs/lists.md from what the library itself says about its lists.
# usage: listPictures.py LIBRASTER.so FOLDER
import ctypes
import sys

raster = ctypes.CDLL(sys.argv[1])
raster.ImageUtil_WriteImage.restype = ctypes.c_bool
BACKGROUND, GRID = 0xFFF4F4F4, 0xFFD8D8D8
COLOURS = [0xFF4477AA, 0xFFEE6677, 0xFF228833, 0xFFCCBB44, 0xFF66CCEE, 0xFFAA3377]
CELL, COLUMNS, ROWS, GAP = 9, 18, 14, 12


class Image(ctypes.Structure):  # ImageUtilImage
    names = "width height depth bpp bytesPerLine flags numColors".split()
    _fields_ = [(name, ctypes.c_uint32) for name in names]
    _fields_ += [("palette", ctypes.c_uint32 * 256), ("data", ctypes.c_void_p)]


class RectList(ctypes.Structure):
    _fields_ = [("rects", ctypes.c_int32 * 4 * 16)]

    def shown(self):
        result = []
        for x, y, width, height in self.rects:
            if width <= 0:
                break
            result.append((x, y, width, height))
        return result


class Picture:
    """Panels side by side, each a grid of cells."""

    def __init__(self, panels):
        self.width = panels * (CELL * COLUMNS + 1) + (panels - 1) * GAP
        self.height = CELL * ROWS + 1
        self.pixels = ctypes.create_string_buffer(self.width * self.height * 4)
        self.fill(0xFFFFFFFF, 0, 0, self.width, self.height)

    def fill(self, colour, x, y, width, height):
        raster.Raster_RectFill(self.pixels, 4 * self.width, 4, colour, x, y, width, height)

    def panel(self, number, rects):
        left = number * (CELL * COLUMNS + 1 + GAP)
        self.fill(GRID, left, 0, CELL * COLUMNS + 1, self.height)
        for row in range(ROWS):
            for column in range(COLUMNS):
                self.fill(BACKGROUND, left + CELL * column + 1, CELL * row + 1, CELL - 1, CELL - 1)
        for i, (x, y, width, height) in enumerate(rects):
            x, y, width, height = left + CELL * x, CELL * y, CELL * width + 1, CELL * height + 1
            self.fill(0xFF202020, x, y, width, height)
            self.fill(COLOURS[i % len(COLOURS)], x + 1, y + 1, width - 2, height - 2)

    def save(self, path):
        image = Image(width=self.width, height=self.height, depth=24, bpp=32,
                      bytesPerLine=4 * self.width, data=ctypes.addressof(self.pixels))
        if not raster.ImageUtil_WriteImage(ctypes.byref(image), path.encode(), 0):
            sys.exit(path + " was not written")


def listOf(rects):
    result = RectList()
    for rect in rects:
        raster.Raster_AddRect(ctypes.byref(result), *rect)
    return result


def show(name, given, after):
    picture = Picture(2)
    picture.panel(0, given)
    picture.panel(1, after.shown())
    picture.save(f"{sys.argv[2]}/{name}.png")
    print(name, after.shown())


overlapping = [(2, 2, 9, 7), (6, 5, 10, 7)]
show("lists-add", overlapping, listOf(overlapping))

touching = [(2, 3, 6, 8), (8, 3, 8, 8)]
show("lists-join", touching, listOf(touching))

hole = listOf([(2, 2, 14, 10)])
raster.Raster_SubRect(ctypes.byref(hole), 6, 5, 5, 4)
show("lists-sub", [(2, 2, 14, 10), (6, 5, 5, 4)], hole)

scattered = [(1 + 4 * (i % 4), 1 + 3 * (i // 4), 2, 2) for i in range(16)]
show("lists-box", scattered, listOf(scattered))

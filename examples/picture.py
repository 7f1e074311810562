#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
# Draws into memory and saves it, from Python. usage: picture.py PICTURE.png [LIBRASTER.so]
import ctypes, ctypes.util, sys

raster = ctypes.CDLL(sys.argv[2] if len(sys.argv) > 2 else ctypes.util.find_library("raster"))


class Image(ctypes.Structure):  # ImageUtilImage
    names = "width height depth bpp bytesPerLine flags numColors".split()
    _fields_ = [(name, ctypes.c_uint32) for name in names]
    _fields_ += [("palette", ctypes.c_uint32 * 256), ("data", ctypes.c_void_p)]


pixels = ctypes.create_string_buffer(320 * 200 * 4)
raster.Raster_RectFill(pixels, 1280, 4, 0xFF204060, 0, 0, 320, 200)
for i in range(8):
    # Operation 6 is exclusive or.
    raster.Raster_RectROPfill(pixels, 1280, 4, 0xFFFFFF, 6, 20 + 30 * i, 20 + 15 * i, 80, 60)
image = Image(width=320, height=200, depth=24, bpp=32, bytesPerLine=1280,
              data=ctypes.addressof(pixels))
raster.ImageUtil_WriteImage.restype = ctypes.c_bool
sys.exit(0 if raster.ImageUtil_WriteImage(ctypes.byref(image), sys.argv[1].encode(), 0) else 1)

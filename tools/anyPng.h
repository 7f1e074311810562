// SPDX-License-Identifier: MIT
//
// PNG pictures of the types that the library leaves out: grey, 16 bits a sample, transparency
// beside the pixels.

#ifndef RASTER_TOOLS_ANY_PNG_H
#define RASTER_TOOLS_ANY_PNG_H

#include "picture.h"
#include "pngFile.h"

namespace tool {

/// Decodes a picture of any type to code 32, alpha included. Samples are taken as they are, without
/// regard to what the file says about their colour space; 16 bits are rounded to the nearest of 8.
Picture decodeAnyPng(const PngFile& png, const std::string& name);

}  // namespace tool

#endif

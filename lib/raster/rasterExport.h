// SPDX-License-Identifier: MIT
/// \file
/// The mark of the names that libraster exports. A program that uses them sees plain declarations.

#ifndef RASTER_RASTER_EXPORT_H
#define RASTER_RASTER_EXPORT_H

#ifdef RASTER_BUILDING_LIBRARY
#define RASTER_EXPORT __attribute__((visibility("default")))
#else
#define RASTER_EXPORT
#endif

#endif

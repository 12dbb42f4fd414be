// Reading and writing pictures for the command-line programs: PNG through
// libpng, BMP through the library's own saveBmp. Row 0 of an Image is the top
// row of the PNG.
#pragma once

#include <pxfx/core.h>

#include <string>

namespace pxio {

// Reads a PNG into a new 24-bit Image (32-bit when it has alpha); null and a
// message in *error on failure.
Image *read_png(const std::string &path, std::string *error);

// Writes an 8-, 16-, 24- or 32-bit Image as PNG (8 bits gray, 32 bits with
// alpha, others RGB); false and a message in *error on failure.
bool write_png(const std::string &path, const Image *image, std::string *error);

} // namespace pxio

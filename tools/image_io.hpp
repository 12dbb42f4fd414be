// Reading and writing pictures for the command-line tool: PNG (libpng), JPEG
// (libjpeg) and BMP. Row 0 of an Image is the top row of the picture.
#pragma once

#include <pxfx/core.h>

#include <string>

namespace pxio {

// Reads a PNG, JPEG or BMP file (recognised by its first bytes) into a new
// 24-bit Image, 32-bit when the file has alpha, 8-bit for 8-bit BMP files.
// Null and a message in *error on failure.
Image *read_image(const std::string &path, std::string *error);

// Writes an Image as PNG, JPEG or BMP, chosen by the extension of `path`
// (.png, .jpg/.jpeg, .bmp). False and a message in *error on failure.
bool write_image(const std::string &path, const Image *image, std::string *error);

// True when write_image knows the extension of `path`.
bool known_output(const std::string &path);

} // namespace pxio

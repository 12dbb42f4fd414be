// The effects gallery: every operation of the table run with its defaults on
// one photo, written as a self-contained HTML page with the pictures beside it.
#pragma once

#include <string>

namespace pxgallery {

// The bundled sample portrait: $PXFX_SAMPLES/astronaut.png, else the installed
// copy, else the one in the source tree.
std::string default_photo();

// Writes DIR/index.html and the pictures; false with a message on failure.
bool build(const std::string &photo, const std::string &dir, std::string *error);

} // namespace pxgallery

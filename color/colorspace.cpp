// Exported per-pixel colour-space conversions.
#include <pxfx/color.h>

#include "color/colorspace.hpp"

using namespace pxfx::colour;

extern "C" {

uint32_t RGBtoHSL(uint32_t colour) { return rgb_to_hsl(colour); }
uint32_t HSLtoRGB(uint32_t colour) { return hsl_to_rgb(colour); }
uint16_t HueToRGB(uint16_t lo, uint16_t hi, uint16_t hue) { return hue_to_rgb(lo, hi, hue); }
uint32_t RGBtoYUV(uint32_t colour) { return rgb_to_yuv(colour); }
uint32_t YUVtoRGB(uint32_t colour) { return yuv_to_rgb(colour); }
uint32_t RGBtoYIQ(uint32_t colour) { return rgb_to_yiq(colour); }
uint32_t YIQtoRGB(uint32_t colour) { return yiq_to_rgb(colour); }
uint32_t RGBtoXYZ(uint32_t colour) { return rgb_to_xyz(colour); }
uint32_t XYZtoRGB(uint32_t colour) { return xyz_to_rgb(colour); }

} // extern "C"

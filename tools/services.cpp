// The exported names that take no picture of their own: records and memory,
// files, integer math, colour models, tables and the building blocks of the
// picture functions. With the registry's rows they make the whole interface.
#include "operations.hpp"

namespace pxop {

const std::vector<std::string_view> &service_functions() {
    static const std::vector<std::string_view> names = {
        // Records, memory and files
        PXOP_FN(malloc_Image), PXOP_FN(free_Image), PXOP_FN(PXImage_Free), PXOP_FN(PX_malloc), PXOP_FN(PX_free),
        PXOP_FN(PX_memcpy), PXOP_FN(PX_memset), PXOP_FN(PX_fopen), PXOP_FN(PX_fclose), PXOP_FN(PX_fread),
        PXOP_FN(PX_fwrite), PXOP_FN(PX_fseek), PXOP_FN(PX_ftell), PXOP_FN(PX_GetFileName), PXOP_FN(PX_ReadMemFile),
        PXOP_FN(PX_ReleaseMemFile), PXOP_FN(saveBmp),
        // Integer math
        PXOP_FN(xxgluSqrtFx), PXOP_FN(Distance2D), PXOP_FN(FastDistance2D), PXOP_FN(tsin), PXOP_FN(tcos),
        PXOP_FN(tatan2), PXOP_FN(PX_rand), PXOP_FN(ltouc), PXOP_FN(px_sqrt), PXOP_FN(px_PtInRect),
        PXOP_FN(px_ShellSort), PXOP_FN(Sort_largelow), PXOP_FN(getpos),
        // Colour models and kernels
        PXOP_FN(RGBtoHSL), PXOP_FN(HSLtoRGB), PXOP_FN(HueToRGB), PXOP_FN(RGBtoYUV), PXOP_FN(YUVtoRGB),
        PXOP_FN(RGBtoYIQ), PXOP_FN(YIQtoRGB), PXOP_FN(RGBtoXYZ), PXOP_FN(XYZtoRGB), PXOP_FN(matrixX),
        // Tables and curves
        PXOP_FN(ZANTOMOPI), PXOP_FN(ZANTOFILTERBK), PXOP_FN(ZANTOFILTER), PXOP_FN(BuildTable), PXOP_FN(MakeMapping),
        PXOP_FN(PointOnCubicBezier), PXOP_FN(ComputeBezier),
        // Raw planes, point lists and histograms
        PXOP_FN(temp_ex), PXOP_FN(DualLinearIntepol), PXOP_FN(ProbabilityDensityValue), PXOP_FN(PXImage_Stamp),
        PXOP_FN(create_wave), PXOP_FN(WeightedCentroid), PXOP_FN(GetMaxHtoThrod2), PXOP_FN(CheckMaxSame),
        PXOP_FN(CombineMinSpace), PXOP_FN(CheckLapOver), PXOP_FN(ImgLineDecode), PXOP_FN(CheckAvailableBlock),
        PXOP_FN(RebuildImg)};
    return names;
}

} // namespace pxop

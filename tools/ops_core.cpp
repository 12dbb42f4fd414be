// Rows of the pixel readers, writers and copies: functions on pictures that
// the tool does not run as operations of their own.
#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

namespace {

using C = Call<Image>;

const std::vector<int32_t> kIndexed = {8, 1, 4}, kColourWritten = {8, 1, 4, 16, 24, 32};

Contract<Image> reader(std::vector<int32_t> formats, std::function<int64_t(C &)> call, int64_t failure = 0) {
    return {.formats = std::move(formats), .call = std::move(call), .failure = failure, .slot = false};
}

} // namespace

void add_core(std::vector<Operation> &t) {
    t.push_back(contract_row(PXOP_FN(GetPixelIndex), "Pixels",
                             reader(kIndexed, [](C &c) { return int64_t(GetPixelIndex(c.a, c.p, c.p)); })));
    t.push_back(contract_row(PXOP_FN(GetPixelColor), "Pixels",
                             reader(kAnyBits, [](C &c) { return int64_t(GetPixelColor(c.a, c.p, ~c.p)); })));
    t.push_back(contract_row(PXOP_FN(GetPixelGray), "Pixels",
                             reader(kAnyBits, [](C &c) { return int64_t(GetPixelGray(c.a, ~c.p, c.p)); })));
    t.push_back(
        contract_row(PXOP_FN(SetPixelIndex), "Pixels",
                     reader(
                         kIndexed, [](C &c) { return SetPixelIndex(c.a, c.p, c.p, c.p), kNoResult; }, kNoResult)));
    t.push_back(contract_row(
        PXOP_FN(SetPixelColor), "Pixels",
        reader(
            kColourWritten, [](C &c) { return SetPixelColor(c.a, c.p, c.p, 0x12345678u), kNoResult; }, kNoResult)));
    // Copies take records without pixels or rows as nothing to copy; a
    // destination whose rows overrun its block takes nothing.
    Contract<Image> copy = reader(kAnyBits, [](C &c) { return int64_t(PX_Img_Copy(c.a, c.b)); });
    copy.pictures = 2;
    copy.accepts = kPixelless;
    copy.accepts.insert(copy.accepts.end(), {shaped("pitch below a row", "kept"), "zero pitch"});
    copy.accepts = in_both(copy.accepts);
    t.push_back(contract_row(PXOP_FN(PX_Img_Copy), "Pixels", copy));
    Contract<Image> alpha = reader({32}, [](C &c) { return int64_t(PX_Img_CopyAlpha(c.a, c.b)); });
    alpha.pictures = 2, alpha.mismatch_fails = true, alpha.accepts = in_both({"null pixels"});
    t.push_back(contract_row(PXOP_FN(PX_Img_CopyAlpha), "Pixels", alpha));
}

} // namespace pxop

// Nearest OpenCV equivalents of our operations, on the same pictures and with
// the same argument lists as the benchmarks they stand beside: CV_<Name>/<args>
// pairs with BM_<Name>/<args>. OpenCV runs on one thread, as the library does.
#include <pxfx/toolkit.h>

#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>
#include <opencv2/photo.hpp>
#ifdef PXFX_BENCH_XPHOTO
#include <opencv2/xphoto.hpp>
#endif

#include "bench_support.hpp"

using namespace pxbench;

namespace {

const bool g_single_thread = [] {
    cv::setNumThreads(1);
    return true;
}();

// An OpenCV header over an Image's pixel block (no copy).
cv::Mat view(Image *im) {
    return cv::Mat(im->height, im->width, CV_8UC(static_cast<int>(im->bitCount / 8)), im->bits, im->pitch);
}

// Picture of the benchmark's bit count (range 0) and source (range 1), viewed as a Mat.
template <class Body> void on_source(benchmark::State &state, Body body) {
    benchmark::DoNotOptimize(g_single_thread);
    Image *src = make_source(static_cast<int32_t>(state.range(0)), state.range(1));
    const cv::Mat in = view(src);
    for (auto _ : state)
        body(in);
    set_rate(state);
    free_Image(&src, 0);
}

void CV_FilterFast(benchmark::State &state) {
    const auto size = static_cast<int>(state.range(2));
    cv::Mat out;
    on_source(state, [&](const cv::Mat &in) {
        cv::blur(in, out, cv::Size(size, size), cv::Point(-1, -1), cv::BORDER_REPLICATE);
    });
}

// PXImage_Smooth strengths 60..79 and 80.. are 5x5 and 7x7 medians.
void CV_Smooth(benchmark::State &state) {
    const int k = state.range(2) < 80 ? 5 : 7;
    cv::Mat out;
    on_source(state, [&](const cv::Mat &in) { cv::medianBlur(in, out, k); });
}

void CV_Blur(benchmark::State &state) {
    const cv::Mat kernel = cv::Mat::ones(3, 3, CV_32F) / 9.0f;
    cv::Mat out;
    on_source(state, [&](const cv::Mat &in) {
        cv::filter2D(in, out, -1, kernel, cv::Point(-1, -1), 0, cv::BORDER_REPLICATE);
    });
}

// PXImage_Sharpen strengths below 40, below 80 and above use 3x3, 5x5 and 7x7 kernels.
void CV_Sharpen(benchmark::State &state) {
    const int k = state.range(2) < 40 ? 3 : state.range(2) < 80 ? 5 : 7;
    cv::Mat kernel(k, k, CV_32F, cv::Scalar(-1.0f));
    kernel.at<float>(k / 2, k / 2) = static_cast<float>(k * k);
    cv::Mat out;
    on_source(state, [&](const cv::Mat &in) {
        cv::filter2D(in, out, -1, kernel, cv::Point(-1, -1), 0, cv::BORDER_REPLICATE);
    });
}

// To HLS and planes, then back.
void CV_SplitCombineHsl(benchmark::State &state) {
    cv::Mat hls, back;
    std::vector<cv::Mat> planes;
    on_source(state, [&](const cv::Mat &in) {
        cv::cvtColor(in, hls, cv::COLOR_BGR2HLS);
        cv::split(hls, planes);
        cv::merge(planes, hls);
        cv::cvtColor(hls, back, cv::COLOR_HLS2BGR);
        benchmark::DoNotOptimize(back.data);
    });
}

void resize_to(benchmark::State &state, cv::Size size) {
    on_source(state, [&](const cv::Mat &in) {
        cv::Mat out;
        cv::resize(in, out, size, 0, 0, cv::INTER_LINEAR);
        benchmark::DoNotOptimize(out.data);
    });
}
void CV_ResizeHalf(benchmark::State &state) { resize_to(state, cv::Size(kWidth / 2, kHeight / 2)); }
void CV_ResizeOneAndAHalf(benchmark::State &state) { resize_to(state, cv::Size(kWidth * 3 / 2, kHeight * 3 / 2)); }

void rotate_by(benchmark::State &state, cv::RotateFlags how) {
    on_source(state, [&](const cv::Mat &in) {
        cv::Mat out;
        cv::rotate(in, out, how);
        benchmark::DoNotOptimize(out.data);
    });
}
void CV_Rotate90(benchmark::State &state) { rotate_by(state, cv::ROTATE_90_CLOCKWISE); }
void CV_Rotate180(benchmark::State &state) { rotate_by(state, cv::ROTATE_180); }
void CV_Rotate270(benchmark::State &state) { rotate_by(state, cv::ROTATE_90_COUNTERCLOCKWISE); }

void CV_Binarization(benchmark::State &state) {
    cv::Mat out;
    on_source(state, [&](const cv::Mat &in) { cv::threshold(in, out, 0, 255, cv::THRESH_BINARY | cv::THRESH_OTSU); });
}

void CV_Sketch(benchmark::State &state) {
    cv::Mat gray, colour;
    on_source(state, [&](const cv::Mat &in) { cv::pencilSketch(in, gray, colour, 60, 0.07f, 0.02f); });
}

#ifdef PXFX_BENCH_XPHOTO
// imOil's radius r is a (2r + 1)^2 window.
void CV_Oil(benchmark::State &state) {
    const auto size = static_cast<int>(2 * state.range(2) + 1);
    cv::Mat out;
    on_source(state, [&](const cv::Mat &in) { cv::xphoto::oilPainting(in, out, size, 1); });
}
#endif

} // namespace

BENCHMARK(CV_FilterFast)
    ->ArgNames({"bits", "photo", "size"})
    ->ArgsProduct({{8, 24, 32}, {0, 1}, {10}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(CV_Smooth)
    ->ArgNames({"bits", "photo", "strength"})
    ->ArgsProduct({{8, 24}, {0, 1}, {70, 90}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(CV_Blur)->ArgNames({"bits", "photo"})->ArgsProduct({{24, 32}, {0, 1}})->Unit(benchmark::kMillisecond);
BENCHMARK(CV_Sharpen)
    ->ArgNames({"bits", "photo", "strength"})
    ->ArgsProduct({{8, 24}, {0}, {20, 60, 90}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(CV_SplitCombineHsl)->ArgNames({"bits", "photo"})->ArgsProduct({{24}, {0, 1}})->Unit(benchmark::kMillisecond);
BENCHMARK(CV_ResizeHalf)->ArgNames({"bits", "photo"})->ArgsProduct({{8, 24}, {0}})->Unit(benchmark::kMillisecond);
BENCHMARK(CV_ResizeOneAndAHalf)
    ->ArgNames({"bits", "photo"})
    ->ArgsProduct({{8, 24}, {0}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(CV_Rotate90)->ArgNames({"bits", "photo"})->ArgsProduct({{8, 24}, {0}})->Unit(benchmark::kMillisecond);
BENCHMARK(CV_Rotate180)->ArgNames({"bits", "photo"})->ArgsProduct({{8, 24}, {0}})->Unit(benchmark::kMillisecond);
BENCHMARK(CV_Rotate270)->ArgNames({"bits", "photo"})->ArgsProduct({{8, 24}, {0}})->Unit(benchmark::kMillisecond);
BENCHMARK(CV_Binarization)->ArgNames({"bits", "photo"})->ArgsProduct({{8}, {0, 1}})->Unit(benchmark::kMillisecond);
BENCHMARK(CV_Sketch)->ArgNames({"bits", "photo"})->ArgsProduct({{24}, {0, 1}})->Unit(benchmark::kMillisecond);
#ifdef PXFX_BENCH_XPHOTO
BENCHMARK(CV_Oil)->ArgNames({"bits", "photo", "r"})->Args({24, 0, 4})->Args({24, 1, 4})->Unit(benchmark::kMillisecond);
#endif

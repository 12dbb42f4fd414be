// pxfx: every image operation of the library on the command line, in batches,
// and as an HTML gallery.
#include <pxfx/pxfx.h>

#include <atomic>
#include <chrono>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <mutex>
#include <string>
#include <thread>
#include <unistd.h>
#include <vector>

#include "core/internal/cpu.hpp"
#include "gallery.hpp"
#include "image_io.hpp"
#include "operations.hpp"

namespace fs = std::filesystem;

namespace {

constexpr int kOk = 0, kFailed = 1, kUsage = 2;

const char *kUsageText = "usage:\n"
                         "  pxfx list                                   every operation and its parameters\n"
                         "  pxfx help OPERATION                         one operation\n"
                         "  pxfx apply OPERATION [--PARAM VALUE ...] [PICTURE OPTIONS] IN OUT\n"
                         "  pxfx apply OPERATION [--PARAM VALUE ...] [PICTURE OPTIONS] IN... -o DIR [-j N]\n"
                         "             [--ext png|jpg|webp|bmp]\n"
                         "  pxfx gallery [PHOTO] -o DIR                 every operation on one photo, as HTML\n"
                         "  pxfx version                                version and the vector target in use\n"
                         "Pictures are read from PNG, JPEG, BMP, WebP or HEIF, turned upright and converted\n"
                         "to sRGB; the output type follows the extension (PNG, JPEG, WebP or BMP).\n"
                         "Picture options:\n"
                         "  --quality N        JPEG and WebP quality, 1..100 (default 92)\n"
                         "  --compression N    PNG compression, 0..9 (default 1, fast)\n"
                         "  --background C     colour under transparent pixels in JPEG output, #RRGGBB (white)\n"
                         "  --max-pixels N     refuse larger inputs (default 268435456)\n"
                         "  --keep-profile     keep the input's colour profile instead of converting to sRGB\n"
                         "  --strip            write no EXIF and no colour profile\n";

std::string describe_formats(uint32_t f) {
    std::string s;
    for (auto [bit, name] :
         {std::pair{pxop::kGray8, "8"}, {pxop::kWord16, "16"}, {pxop::kBgr24, "24"}, {pxop::kBgra32, "32"}})
        if (f & bit) {
            if (!s.empty()) s += ',';
            s += name;
        }
    return s + " bits";
}

void print_operation(const pxop::Operation &op) {
    std::printf("  %-22s %s\n", std::string(op.name).c_str(), std::string(op.summary).c_str());
    std::printf("  %-22s %s, takes %s\n", "", std::string(op.function).c_str(), describe_formats(op.formats).c_str());
    for (const pxop::Param &p : op.params)
        std::printf("  %-22s --%s %s..%s (default %s): %s\n", "", std::string(p.name).c_str(),
                    pxop::number_text(p.lo, p.integer).c_str(), pxop::number_text(p.hi, p.integer).c_str(),
                    pxop::number_text(p.def, p.integer).c_str(), std::string(p.help).c_str());
}

int cmd_list() {
    std::string_view group;
    for (const pxop::Operation &op : pxop::operations()) {
        if (op.group != group) {
            std::printf("%s%s\n", group.empty() ? "" : "\n", std::string(op.group).c_str());
            group = op.group;
        }
        print_operation(op);
    }
    return kOk;
}

// Parses a parameter value within its range; false with a message otherwise.
bool parse_value(const pxop::Param &p, const std::string &text, double *out, std::string *error) {
    char *end = nullptr;
    const double v = std::strtod(text.c_str(), &end);
    const bool number = !text.empty() && end != nullptr && *end == '\0';
    const std::string why = pxop::value_error(p, number ? v : std::nan(""), text);
    if (!why.empty()) {
        *error = "--" + why;
        return false;
    }
    *out = v;
    return true;
}

struct Job {
    const pxop::Operation *op = nullptr;
    pxop::Args args;
    std::vector<std::string> inputs;
    std::string output;    // single-file mode
    std::string outputDir; // batch mode
    std::string ext = "png";
    unsigned threads = 1;
    pxio::ReadOptions reading;
    pxio::WriteOptions writing;
};

// Parses a whole number in lo..hi; false when the text is not one.
bool parse_whole(const std::string &text, long long lo, long long hi, long long *out) {
    char *end = nullptr;
    const long long v = std::strtoll(text.c_str(), &end, 10);
    if (text.empty() || *end != '\0' || v < lo || v > hi) return false;
    *out = v;
    return true;
}

// Takes a picture option at argv[i] (and its value); 0 when it is none, 1 when
// taken, 2 after printing a usage error.
int picture_option(Job &job, int argc, char **argv, int &i) {
    const std::string a = argv[i];
    if (a == "--strip") return job.writing.strip = true, 1;
    if (a == "--keep-profile") return job.reading.keepProfile = true, 1;
    if (a != "--quality" && a != "--compression" && a != "--background" && a != "--max-pixels") return 0;
    if (i + 1 >= argc) {
        std::fprintf(stderr, "pxfx: %s needs a value\n", a.c_str());
        return 2;
    }
    const std::string v = argv[++i];
    long long n = 0;
    bool ok = true;
    if (a == "--quality")
        ok = parse_whole(v, 1, 100, &n), job.writing.quality = static_cast<int>(n);
    else if (a == "--compression")
        ok = parse_whole(v, 0, 9, &n), job.writing.compression = static_cast<int>(n);
    else if (a == "--max-pixels")
        ok = parse_whole(v, 1, INT64_MAX, &n), job.reading.maxPixels = static_cast<uint64_t>(n);
    else
        ok = pxio::parse_colour(v, &job.writing.background);
    if (!ok) {
        std::fprintf(stderr, "pxfx: %s: invalid value '%s' (see 'pxfx help')\n", a.c_str(), v.c_str());
        return 2;
    }
    return 1;
}

// Reads, converts, runs and writes one picture; the output appears only when
// complete (written under a temporary name, then renamed).
bool process(const Job &job, const std::string &in, const std::string &out, std::string *error) {
    Image *src = nullptr;
    pxio::Metadata meta;
    if (!pxio::read_picture(in, job.reading, &src, &meta, error)) return false;
    std::string why;
    Image *result = pxop::apply(*job.op, src, job.args, &why);
    free_Image(&src, 0);
    if (result == nullptr) {
        *error = in + ": " + why;
        return false;
    }
    const fs::path target(out);
    const fs::path temp =
        target.parent_path() / (".pxfx-" + std::to_string(getpid()) + "-" +
                                std::to_string(std::hash<std::string>{}(out)) + "-" + target.filename().string());
    const bool written = pxio::write_picture(temp.string(), result, meta, job.writing, error);
    free_Image(&result, 0);
    std::error_code ec;
    if (!written) {
        fs::remove(temp, ec);
        return false;
    }
    fs::rename(temp, target, ec);
    if (ec) {
        fs::remove(temp, ec);
        *error = out + ": cannot write";
        return false;
    }
    return true;
}

int run_batch(const Job &job) {
    const auto start = std::chrono::steady_clock::now();
    const bool bar = isatty(2) != 0;
    std::atomic<size_t> next{0}, done{0}, failed{0};
    std::mutex printing;
    auto worker = [&] {
        for (size_t i; (i = next++) < job.inputs.size();) {
            const std::string &in = job.inputs[i];
            const std::string out = (fs::path(job.outputDir) /
                                     (fs::path(in).stem().string() + "-" + std::string(job.op->name) + "." + job.ext))
                                        .string();
            std::string error;
            const bool ok = process(job, in, out, &error);
            std::lock_guard<std::mutex> lock(printing);
            if (!ok) {
                ++failed;
                std::fprintf(stderr, "%s%s\n", bar ? "\r\033[K" : "", error.c_str());
            }
            const size_t n = ++done;
            if (bar) {
                const size_t width = 30, filled = n * width / job.inputs.size();
                std::fprintf(stderr, "\r[%s%s] %zu/%zu", std::string(filled, '#').c_str(),
                             std::string(width - filled, ' ').c_str(), n, job.inputs.size());
            }
        }
    };
    std::vector<std::thread> pool;
    for (unsigned t = 1; t < job.threads && t < job.inputs.size(); ++t)
        pool.emplace_back(worker);
    worker();
    for (std::thread &t : pool)
        t.join();
    const double secs = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    std::fprintf(stderr, "%s%zu files, %zu operations, %zu failed, %.2f s\n", bar ? "\n" : "", job.inputs.size(),
                 job.inputs.size() - failed.load(), failed.load(), secs);
    return failed == 0 ? kOk : kFailed;
}

int cmd_apply(int argc, char **argv) {
    if (argc < 1 || std::string(argv[0]) == "--help" || std::string(argv[0]) == "-h") {
        std::fputs(kUsageText, argc < 1 ? stderr : stdout);
        return argc < 1 ? kUsage : kOk;
    }
    Job job;
    job.op = pxop::find_operation(argv[0]);
    if (job.op == nullptr) {
        std::fprintf(stderr, "pxfx: unknown operation '%s' (see 'pxfx list')\n", argv[0]);
        return kUsage;
    }
    job.args = pxop::default_args(*job.op);
    for (int i = 1; i < argc; ++i) {
        const std::string a = argv[i];
        if (a == "--help" || a == "-h") {
            print_operation(*job.op);
            return kOk;
        }
        if ((a == "-o" || a == "-j" || a == "--ext") && i + 1 >= argc) {
            std::fprintf(stderr, "pxfx: %s needs a value\n", a.c_str());
            return kUsage;
        }
        if (a == "-o") {
            job.outputDir = argv[++i];
        } else if (a == "-j") {
            const int n = std::atoi(argv[++i]);
            if (n < 1 || n > 64) {
                std::fprintf(stderr, "pxfx: -j takes 1..64\n");
                return kUsage;
            }
            job.threads = static_cast<unsigned>(n);
        } else if (a == "--ext") {
            job.ext = argv[++i];
            if (!pxio::known_output("x." + job.ext)) {
                std::fprintf(stderr, "pxfx: --ext takes png, jpg, webp or bmp\n");
                return kUsage;
            }
        } else if (const int taken = picture_option(job, argc, argv, i); taken != 0) {
            if (taken == 2) return kUsage;
        } else if (a.rfind("--", 0) == 0) {
            size_t k = 0;
            while (k < job.op->params.size() && job.op->params[k].name != a.substr(2))
                ++k;
            if (k == job.op->params.size()) {
                std::fprintf(stderr, "pxfx: %s has no parameter %s\n", std::string(job.op->name).c_str(), a.c_str());
                return kUsage;
            }
            std::string error;
            if (i + 1 >= argc || !parse_value(job.op->params[k], argv[++i], &job.args.values[k], &error)) {
                std::fprintf(stderr, "pxfx: %s\n", error.empty() ? (a + " needs a value").c_str() : error.c_str());
                return kUsage;
            }
        } else {
            job.inputs.push_back(a);
        }
    }
    if (job.outputDir.empty()) {
        if (job.inputs.size() != 2) {
            std::fprintf(stderr, "pxfx: apply needs IN and OUT (or IN... -o DIR)\n");
            return kUsage;
        }
        job.output = job.inputs.back();
        job.inputs.pop_back();
        if (!pxio::known_output(job.output)) {
            std::fprintf(stderr, "pxfx: %s: unknown output type (use .png, .jpg, .webp or .bmp)\n", job.output.c_str());
            return kUsage;
        }
        std::string error;
        if (!process(job, job.inputs[0], job.output, &error)) {
            std::fprintf(stderr, "pxfx: %s\n", error.c_str());
            return kFailed;
        }
        return kOk;
    }
    if (job.inputs.empty()) {
        std::fprintf(stderr, "pxfx: no input pictures\n");
        return kUsage;
    }
    std::error_code ec;
    fs::create_directories(job.outputDir, ec);
    if (!fs::is_directory(job.outputDir)) {
        std::fprintf(stderr, "pxfx: cannot create %s\n", job.outputDir.c_str());
        return kFailed;
    }
    return run_batch(job);
}

int cmd_gallery(int argc, char **argv) {
    std::string photo, dir;
    for (int i = 0; i < argc; ++i) {
        const std::string a = argv[i];
        if (a == "--help" || a == "-h") {
            std::fputs(kUsageText, stdout);
            return kOk;
        }
        if (a == "-o" && i + 1 < argc)
            dir = argv[++i];
        else if (photo.empty() && a.rfind("-", 0) != 0)
            photo = a;
        else {
            std::fprintf(stderr, "pxfx: gallery: unexpected argument %s\n", a.c_str());
            return kUsage;
        }
    }
    if (dir.empty()) {
        std::fprintf(stderr, "pxfx: gallery needs -o DIR\n");
        return kUsage;
    }
    if (photo.empty()) photo = pxgallery::default_photo();
    std::string error;
    if (!pxgallery::build(photo, dir, &error)) {
        std::fprintf(stderr, "pxfx: %s\n", error.c_str());
        return kFailed;
    }
    std::printf("%s\n", (fs::path(dir) / "index.html").string().c_str());
    return kOk;
}

} // namespace

int main(int argc, char **argv) {
    if (argc < 2) {
        std::fputs(kUsageText, stderr);
        return kUsage;
    }
    const std::string cmd = argv[1];
    if (cmd == "--help" || cmd == "-h" || cmd == "help") {
        if (cmd == "help" && argc > 2) {
            const pxop::Operation *op = pxop::find_operation(argv[2]);
            if (op == nullptr) {
                std::fprintf(stderr, "pxfx: unknown operation '%s'\n", argv[2]);
                return kUsage;
            }
            print_operation(*op);
            return kOk;
        }
        std::fputs(kUsageText, stdout);
        return kOk;
    }
    if (cmd == "list") return cmd_list();
    if (cmd == "version") {
        // The target follows PXFX_CPU (scalar, 128 or the best one).
        std::printf("pxfx %s\nvector target: %s\n", PXFX_VERSION, pxfx::cpu::target_name());
        return kOk;
    }
    if (cmd == "apply") return cmd_apply(argc - 2, argv + 2);
    if (cmd == "gallery") return cmd_gallery(argc - 2, argv + 2);
    std::fprintf(stderr, "pxfx: unknown command '%s'\n%s", cmd.c_str(), kUsageText);
    return kUsage;
}

#include "gallery.hpp"

#include <pxfx/pxfx.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <map>
#include <sstream>
#include <vector>

#include "image_io.hpp"
#include "operations.hpp"

namespace fs = std::filesystem;

namespace pxgallery {

namespace {

struct Card {
    const pxop::Operation *op;
    std::string before, after, params;
    double ms = 0;
};

std::string params_text(const pxop::Operation &op) {
    std::ostringstream s;
    for (const pxop::Param &p : op.params)
        s << "--" << p.name << " " << p.def << " ";
    return s.str();
}

const char *kStyle = R"(
body{font-family:system-ui,sans-serif;margin:0;background:#f4f4f2;color:#222}
header{padding:1rem 1.5rem;background:#222;color:#eee}
header h1{margin:0 0 .3rem;font-size:1.4rem}
section{padding:0 1.5rem 1rem}
h2{font-size:1.1rem;border-bottom:1px solid #ccc;padding-top:1rem}
.grid{display:grid;grid-template-columns:repeat(auto-fill,minmax(300px,1fr));gap:1rem}
figure{margin:0;background:#fff;border-radius:6px;box-shadow:0 1px 3px rgba(0,0,0,.15);padding:.5rem}
.pair{display:grid;grid-template-columns:1fr 1fr;gap:.3rem}
.pair img{width:100%;height:auto;display:block;image-rendering:auto}
figcaption{font-size:.85rem;padding-top:.4rem;line-height:1.4}
code{font-size:.8rem;color:#555}
.failed{color:#a00}
)";

} // namespace

std::string default_photo() {
    if (const char *env = std::getenv("PXFX_SAMPLES"); env != nullptr && *env != '\0')
        return (fs::path(env) / "astronaut.png").string();
    const fs::path installed = fs::path(PXFX_INSTALLED_SAMPLES) / "astronaut.png";
    if (fs::exists(installed)) return installed.string();
    return (fs::path(PXFX_SOURCE_SAMPLES) / "astronaut.png").string();
}

bool build(const std::string &photo, const std::string &dir, std::string *error) {
    Image *src = pxio::read_image(photo, error);
    if (src == nullptr) return false;
    std::error_code ec;
    fs::create_directories(dir, ec);
    if (!fs::is_directory(dir)) {
        free_Image(&src, 0);
        *error = "cannot create " + dir;
        return false;
    }
    std::map<uint32_t, std::string> inputs; // one "before" picture per format
    std::vector<Card> cards;
    for (const pxop::Operation &op : pxop::operations()) {
        Image *in = pxop::convert_for(op, src);
        if (in == nullptr) continue;
        Card card{&op, "", "", params_text(op)};
        if (!inputs.count(in->bitCount)) {
            const std::string name = "input-" + std::to_string(in->bitCount) + ".png";
            if (pxio::write_image((fs::path(dir) / name).string(), in, error)) inputs[in->bitCount] = name;
        }
        card.before = inputs.count(in->bitCount) ? inputs[in->bitCount] : "";
        const auto start = std::chrono::steady_clock::now();
        Image *out = op.run(in, pxop::default_args(op));
        card.ms = std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - start).count();
        const std::string name = std::string(op.name) + ".png";
        if (out != nullptr && pxio::write_image((fs::path(dir) / name).string(), out, error)) card.after = name;
        free_Image(&out, 0);
        free_Image(&in, 0);
        cards.push_back(card);
    }

    std::ostringstream html;
    const std::time_t now = std::time(nullptr);
    char date[64];
    std::strftime(date, sizeof date, "%Y-%m-%d %H:%M UTC", std::gmtime(&now));
    html << "<!doctype html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
         << "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n"
         << "<title>pxfx gallery</title>\n<style>" << kStyle << "</style>\n</head>\n<body>\n"
         << "<header><h1>pxfx gallery</h1><div>" << fs::path(photo).filename().string() << ", " << src->width << " x "
         << src->height << ", " << cards.size() << " operations with their default parameters, " << date
         << ". Click a picture for full size.</div></header>\n";
    std::string group;
    for (const Card &c : cards) {
        if (c.op->group != group) {
            html << (group.empty() ? "" : "</div></section>\n") << "<section><h2>" << c.op->group
                 << "</h2><div class=\"grid\">\n";
            group = c.op->group;
        }
        html << "<figure><div class=\"pair\">";
        if (!c.before.empty())
            html << "<a href=\"" << c.before << "\"><img src=\"" << c.before << "\" alt=\"before\"></a>";
        if (!c.after.empty())
            html << "<a href=\"" << c.after << "\"><img src=\"" << c.after << "\" alt=\"" << c.op->name << "\"></a>";
        html << "</div><figcaption><b>" << c.op->name << "</b> <code>" << c.op->function << "</code><br>"
             << c.op->summary << "<br>" << (c.params.empty() ? "no parameters" : c.params) << "<br>";
        char ms[32];
        std::snprintf(ms, sizeof ms, "%.1f ms", c.ms);
        html << (c.after.empty() ? "<span class=\"failed\">failed on this photo</span>" : ms)
             << "</figcaption></figure>\n";
    }
    if (!group.empty()) html << "</div></section>\n";
    html << "</body>\n</html>\n";
    free_Image(&src, 0);

    std::ofstream page(fs::path(dir) / "index.html");
    page << html.str();
    if (!page) {
        *error = "cannot write " + (fs::path(dir) / "index.html").string();
        return false;
    }
    return true;
}

} // namespace pxgallery

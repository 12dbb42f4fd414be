// The pxfx tool end to end: every operation of the table through `pxfx apply`,
// batches, and the error cases (exit status, no output left behind).
#include <filesystem>

#include "image_io.hpp"
#include "operations.hpp"
#include "support/test_images.hpp"
#include "tools/temp_dir.hpp"

namespace fs = std::filesystem;
using namespace pxtest;

namespace {

class Cli : public InTempDir {
  protected:
    void SetUp() override {
        InTempDir::SetUp();
        std::string error;
        Owned colour = random_image(160, 90, 24, 1);
        Owned alpha = random_image(131, 47, 32, 2);
        ASSERT_TRUE(pxio::write_image((dir / "colour.png").string(), colour.get(), &error)) << error;
        ASSERT_TRUE(pxio::write_image((dir / "alpha.png").string(), alpha.get(), &error)) << error;
    }
    static int run(const std::string &args) {
        const int status = std::system((std::string(PXFX_CLI) + " " + args + " >/dev/null 2>&1").c_str());
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    std::string p(const char *name) const { return (dir / name).string(); }
    // The picture in dir/name, which must read.
    Owned read(const char *name) const {
        std::string error;
        Owned im(pxio::read_image(p(name), &error));
        EXPECT_TRUE(im) << name << ": " << error;
        return im;
    }
};

} // namespace

TEST_F(Cli, EveryOperationProducesADecodablePicture) {
    for (const pxop::Operation &op : pxop::operations()) {
        for (const char *input : {"colour.png", "alpha.png"}) {
            const std::string out = p("out.png");
            ASSERT_EQ(run("apply " + std::string(op.name) + " " + p(input) + " " + out), 0) << op.name << " " << input;
            Owned in = read(input), result = read("out.png");
            ASSERT_TRUE(result) << op.name;
            if (op.sameSize) {
                EXPECT_EQ(result->width, in->width) << op.name;
                EXPECT_EQ(result->height, in->height) << op.name;
            }
            fs::remove(out);
        }
    }
}

TEST_F(Cli, FormatsAndBatches) {
    // BMP output stands upright: it reads back as the PNG path's result.
    EXPECT_EQ(run("apply sketch " + p("colour.png") + " " + p("a.bmp")) +
                  run("apply sketch " + p("colour.png") + " " + p("a.png")),
              0);
    EXPECT_EQ(diff(read("a.bmp").get(), read("a.png").get()), "");

    // Pictures from a phone: turned upright, written in each output format
    // with the picture options.
    const std::string sideways = (fs::path(PXFX_TEST_DATA_DIR) / "pictures" / "orientation-6.jpg").string();
    for (const char *out : {"up.png", "up.webp", "up.jpg", "up.bmp"}) {
        ASSERT_EQ(run("apply negative --quality 80 --compression 9 --strip --keep-profile --background '#102030' " +
                      sideways + " " + p(out)),
                  0)
            << out;
        Owned up = read(out);
        EXPECT_TRUE(up && up->width == 48) << out;
    }

    EXPECT_EQ(run("apply neon " + p("colour.png") + " " + p("alpha.png") + " -o " + p("batch") + " -j 2"), 0);
    EXPECT_TRUE(fs::exists(p("batch/colour-neon.png")));
    EXPECT_TRUE(fs::exists(p("batch/alpha-neon.png")));
}

TEST_F(Cli, ErrorsExitNonZeroAndLeaveNoOutput) {
    std::ofstream(p("corrupt.png")) << "\x89PNG\r\n\x1a\n not really";
    const std::string out = p("never.png");
    EXPECT_EQ(run("apply no-such-operation " + p("colour.png") + " " + out), 2);
    EXPECT_EQ(run("apply sketch " + p("missing.png") + " " + out), 1);
    EXPECT_EQ(run("apply sketch " + p("corrupt.png") + " " + out), 1);
    EXPECT_EQ(run("apply sketch " + p("colour.png") + " " + p("never.tiff")), 2);
    EXPECT_EQ(run("apply sketch " + p("colour.png")), 2);
    EXPECT_EQ(run("apply sketch --no-such-param 3 " + p("colour.png") + " " + out), 2);
    EXPECT_EQ(run("apply sketch " + p("colour.png") + " " + p("no-dir/x.png")), 1);
    for (const char *bad : {"--quality 0", "--quality 101", "--compression 10", "--background nope", "--max-pixels 0",
                            "--max-pixels x", "--quality"})
        EXPECT_EQ(run("apply sketch " + std::string(bad) + " " + p("colour.png") + " " + out), 2) << bad;
    EXPECT_EQ(run("apply sketch --max-pixels 14399 " + p("colour.png") + " " + out), 1);
    for (const char *bad : {"401", "abc", "4.5e2"}) // an operation's parameter out of range or not a number
        EXPECT_EQ(run(std::string("apply resize --width ") + bad + " " + p("colour.png") + " " + out), 2) << bad;
    EXPECT_EQ(run("frobnicate"), 2);
    EXPECT_EQ(run(""), 2);
    EXPECT_EQ(run("--help"), 0);
    EXPECT_EQ(run("apply sketch --help"), 0);
    EXPECT_EQ(run("list"), 0);
    EXPECT_EQ(run("version"), 0);
    // The version names the vector target that PXFX_CPU chose.
    if (FILE *pipe = popen(("PXFX_CPU=scalar " + std::string(PXFX_CLI) + " version").c_str(), "r")) {
        char text[256] = {};
        const size_t got = std::fread(text, 1, sizeof text - 1, pipe);
        pclose(pipe);
        EXPECT_NE(std::string(text, got).find("vector target: scalar"), std::string::npos) << text;
    }
    for (const auto &entry : fs::directory_iterator(dir)) {
        const std::string name = entry.path().filename().string();
        EXPECT_TRUE(name == "colour.png" || name == "alpha.png" || name == "corrupt.png") << "left behind: " << name;
    }
}

// zenfx screenshot as make screenshots and users run it: a PNG of the editor
// after processing, twice the pixels at --scale 2, the same bytes for the
// same run, and clear refusals.
#include <gtest/gtest.h>

#include <cstdint>
#include <fstream>
#include <iterator>
#include <string>

#include "ZenfxRunner.h"

using zentest::RunZenfx;

namespace {

struct Png {
    std::string bytes;
    std::uint32_t width = 0;
    std::uint32_t height = 0;
};

std::uint32_t BigEndian(const std::string& bytes, std::size_t at) {
    std::uint32_t value = 0;
    for (std::size_t i = 0; i < 4; ++i) value = value << 8 | static_cast<unsigned char>(bytes[at + i]);
    return value;
}

// The size from the IHDR chunk, which a PNG always starts with.
Png ReadPng(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    Png png;
    png.bytes.assign(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
    if (png.bytes.size() > 24 && png.bytes.compare(0, 8, "\x89PNG\r\n\x1a\n") == 0 &&
        png.bytes.compare(12, 4, "IHDR") == 0) {
        png.width = BigEndian(png.bytes, 16);
        png.height = BigEndian(png.bytes, 20);
    }
    return png;
}

}  // namespace

TEST(ZenfxScreenshot, WritesTheEditorAfterProcessingAtTwiceThePixelsAtScaleTwoAndTheSameBytesEachRun) {
    zentest::TempFolder folder;
    const auto shoot = [&](const std::string& name, const std::vector<std::string>& extra) {
        std::vector<std::string> arguments = {"screenshot", "Limiter", "-o", folder / name};
        arguments.insert(arguments.end(), extra.begin(), extra.end());
        const zentest::ZenfxResult result = RunZenfx(arguments);
        EXPECT_EQ(result.exitCode, 0) << result.err;
        return ReadPng(folder / name);
    };
    const Png one = shoot("one.png", {"--at", "1"});
    const Png again = shoot("again.png", {"--at", "1"});
    const Png two = shoot("two.png", {"--at", "1", "--scale", "2"});
    const Png silent = shoot("silent.png", {"--at", "0"});

    // A whole editor, not an empty window.
    EXPECT_GE(one.width, 300u);
    EXPECT_GE(one.height, 150u);
    EXPECT_EQ(two.width, 2 * one.width);
    EXPECT_EQ(two.height, 2 * one.height);
    // make screenshots commits these: a rerun must not change a byte.
    EXPECT_EQ(one.bytes, again.bytes);
    // The meters show what was processed.
    EXPECT_NE(one.bytes, silent.bytes);
    EXPECT_EQ(folder.Files(), (std::vector<std::string>{"again.png", "one.png", "silent.png", "two.png"}));
}

TEST(ZenfxScreenshot, PicturesControlPluginsAndRefusesWhatItCannotShow) {
    zentest::TempFolder folder;
    const zentest::ZenfxResult control = RunZenfx({"screenshot", "Test Tones Settings", "-o", folder / "tones.png"});
    EXPECT_EQ(control.exitCode, 0) << control.err;
    EXPECT_GE(ReadPng(folder / "tones.png").width, 100u);

    const zentest::ZenfxResult unknown = RunZenfx({"screenshot", "Limitr", "-o", folder / "x.png"});
    EXPECT_NE(unknown.exitCode, 0);
    EXPECT_NE(unknown.err.find("did you mean 'Limiter'"), std::string::npos) << unknown.err;

    const zentest::ZenfxResult past = RunZenfx({"screenshot", "Limiter", "--at", "60", "-o", folder / "x.png"});
    EXPECT_EQ(past.exitCode, 2);
    EXPECT_NE(past.err.find("past the end"), std::string::npos) << past.err;

    const zentest::ZenfxResult preset =
        RunZenfx({"screenshot", "Limiter", "--preset", "No Such Preset", "-o", folder / "x.png"});
    EXPECT_EQ(preset.exitCode, 2);
    EXPECT_NE(preset.err.find("no preset"), std::string::npos) << preset.err;

    const zentest::ZenfxResult scale = RunZenfx({"screenshot", "Limiter", "--scale", "3", "-o", folder / "x.png"});
    EXPECT_EQ(scale.exitCode, 2);
    // Nothing half-written is left behind by any of them.
    EXPECT_EQ(folder.Files(), std::vector<std::string>{"tones.png"});
}

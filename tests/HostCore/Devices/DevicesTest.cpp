// The device bridge: blocks as the format says, the clocked device's thread,
// and files through the file device.
#include <gtest/gtest.h>
#include <sndfile.h>

#include <chrono>
#include <cstdio>
#include <fstream>
#include <thread>
#include <vector>

#include "HostCore/Devices/ClockedNullDevice.h"
#include "HostCore/Devices/DeviceBridge.h"
#include "HostCore/Devices/FileDevice.h"
#include "HostCore/Devices/NullDevice.h"
#include "HostCore/HostError.h"
#include "HostCore/Settings/Documents/IOInterfaceDocument.h"

using namespace zen::host;

namespace {

// Counts frames, checks the buffers and writes a ramp of the frame index.
struct Counting : AudioCallback {
    std::vector<std::uint32_t> blocks;
    std::uint64_t frames = 0;
    bool zeroedOutputs = true;
    std::uint32_t outputs = 0;
    std::vector<float> lastInputs;
    void ProcessBlock(const float* const* in, float* const* out, std::uint32_t n) noexcept override {
        blocks.push_back(n);
        for (std::uint32_t i = 0; i < n; ++i, ++frames)
            for (std::uint32_t c = 0; c < outputs; ++c) {
                zeroedOutputs = zeroedOutputs && out[c][i] == 0.0f;
                out[c][i] = static_cast<float>(frames) * 1e-5f * static_cast<float>(c + 1);
            }
        if (in != nullptr && n > 0 && in[0] != nullptr) lastInputs.assign(in[0], in[0] + n);
    }
};

std::string TempPath(const char* name) { return std::string(::testing::TempDir()) + name; }

}  // namespace

TEST(NullDevice, RunsFullBlocksThenTheRestWithZeroedBuffers) {
    NullDevice device({48000, 64, 1, 2});
    Counting callback;
    callback.outputs = 2;
    EXPECT_EQ(device.Run(callback, 200), 200u);
    EXPECT_EQ(callback.blocks, (std::vector<std::uint32_t>{64, 64, 64, 8}));
    EXPECT_TRUE(callback.zeroedOutputs);
    EXPECT_THROW(NullDevice({4000, 64, 2, 2}), HostError);
    EXPECT_THROW(NullDevice({48000, 0, 2, 2}), HostError);
}

TEST(ClockedNullDevice, RunsOnItsOwnThreadUntilStoppedOrDone) {
    ClockedNullDevice device({48000, 48, 0, 1});
    Counting callback;
    callback.outputs = 1;
    device.Start(callback, 480);  // ten blocks of 1 ms
    while (device.IsRunning()) std::this_thread::sleep_for(std::chrono::milliseconds(1));
    EXPECT_EQ(device.BlocksRun(), 10u);
    EXPECT_EQ(callback.frames, 480u);
    EXPECT_LE(device.LateBlocks(), device.BlocksRun());

    Counting endless;
    endless.outputs = 1;
    device.Start(endless);
    EXPECT_THROW(device.Start(endless), HostError);
    while (device.BlocksRun() < 13) std::this_thread::sleep_for(std::chrono::milliseconds(1));
    device.Stop();
    EXPECT_FALSE(device.IsRunning());
    EXPECT_GE(endless.frames, 3u * 48u);
    EXPECT_EQ(endless.frames % 48, 0u);
}

TEST(FileDevice, ReadsTheInputFileAndWritesTheOutputWholeOnlyWhenDone) {
    const std::string input = TempPath("device-in.wav"), output = TempPath("device-out.wav");
    {
        Counting ramp;
        ramp.outputs = 2;
        FileDevice writer({}, input, {44100, 100, 0, 2});
        EXPECT_FALSE(std::ifstream(input).good());  // nothing at the destination while running
        writer.Run(ramp, 1000);
    }
    FileDevice reader(input, output, {48000, 256, 0, 1});
    EXPECT_EQ(reader.Format().sampleRate, 44100);  // the input file's rate and channels
    EXPECT_EQ(reader.Format().inputs, 2u);
    EXPECT_EQ(reader.InputFrames(), 1000u);
    Counting copy;
    copy.outputs = 1;
    EXPECT_EQ(reader.Run(copy, 0), 1000u);
    ASSERT_EQ(copy.lastInputs.size(), 1000u - 3u * 256u);
    EXPECT_FLOAT_EQ(copy.lastInputs.back(), 999 * 1e-5f);

    SF_INFO info{};
    SNDFILE* file = sf_open(output.c_str(), SFM_READ, &info);
    ASSERT_NE(file, nullptr);
    EXPECT_EQ(info.frames, 1000);
    EXPECT_EQ(info.format, SF_FORMAT_WAV | SF_FORMAT_FLOAT);
    sf_close(file);
    std::remove(input.c_str());
    std::remove(output.c_str());

    EXPECT_THROW(FileDevice(TempPath("missing.wav"), {}, {}), HostError);
    EXPECT_THROW(FileDevice({}, TempPath("out.mp7"), {}), HostError);
    EXPECT_THROW(FileDevice({}, "/proc/nowhere/out.wav", {}), HostError);
    EXPECT_EQ(FileDevice::OutputFormat("x.FLAC"), SF_FORMAT_FLAC | SF_FORMAT_PCM_24);
}

TEST(DeviceBridge, OpensTheDeviceOfTheIoDocumentInItsFormat) {
    SettingsDocument d(IOInterfaceDocument::Schema());
    d.Set("device", "null");
    d.Set("sampleRate", "96000");
    d.Set("blockSize", "128");
    d.Set("inputs", "0");
    d.Set("outputs", "6");
    d.Set("output3.source", "0");
    const auto io = IOInterfaceDocument::Read(d);
    EXPECT_EQ(io.outputRouting[2], 0);
    EXPECT_EQ(io.outputRouting[3], 4);  // one to one unless changed
    const auto device = DeviceBridge::Open(io);
    EXPECT_EQ(device->Name(), "null");
    EXPECT_EQ(device->Format().sampleRate, 96000);
    EXPECT_EQ(device->Format().blockSize, 128u);
    EXPECT_EQ(device->Format().outputs, 6u);

    d.Set("device", "file");
    d.Set("outputFile", TempPath("bridge.wav"));
    EXPECT_EQ(DeviceBridge::Open(IOInterfaceDocument::Read(d))->Name(), "file");
    d.Set("inputFile", TempPath("no-such-input.wav"));
    EXPECT_THROW(DeviceBridge::Open(IOInterfaceDocument::Read(d)), HostError);
}

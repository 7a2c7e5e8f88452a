#include <gtest/gtest.h>

#include <cstdint>

#include "System/AlignedBuffer.h"

TEST(AlignedBuffer, AlignedZeroedAndMovable) {
    for (std::size_t size : {1u, 3u, 16u, 17u, 1000u}) {
        ora::AlignedBuffer<float> buffer(size);
        ASSERT_EQ(buffer.size(), size);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(buffer.data()) % ora::kBufferAlignment, 0u);
        for (float v : buffer) EXPECT_EQ(v, 0.0f);
        buffer[size - 1] = 2.0f;
        ora::AlignedBuffer<float> moved(std::move(buffer));
        EXPECT_TRUE(buffer.empty());
        EXPECT_EQ(moved[size - 1], 2.0f);
        moved.Clear();
        EXPECT_EQ(moved[size - 1], 0.0f);
    }
    static_assert(!std::is_copy_constructible<ora::AlignedBuffer<float>>::value, "no accidental copies");
}

TEST(AlignedBuffer, ResizeToZeroReleases) {
    ora::AlignedBuffer<double> buffer(8);
    buffer.Resize(0);
    EXPECT_TRUE(buffer.empty());
    EXPECT_EQ(buffer.data(), nullptr);
}

// Frame variables: typed creation from the pool, checked access, the dump,
// and the pool giving every vector back.
#include <gtest/gtest.h>

#include <cstdio>
#include <string>
#include <vector>

#include "FFT/Frame.h"
#include "../System/CheckRecorder.h"

using namespace ora::fft;
using zentest::CheckRecorder;

namespace {

std::string DumpOf(const Frame& frame) {
    char* text = nullptr;
    std::size_t size = 0;
    std::FILE* out = open_memstream(&text, &size);
    frame.Dump(out);
    std::fclose(out);
    std::string result(text, size);
    std::free(text);
    return result;
}

}  // namespace

TEST(Frame, VariablesAreCreatedOnceAndReadOnlyWithTheirType) {
    Pool pool;
    {
        Frame frame(pool);
        CheckRecorder checks;
        ASSERT_TRUE(frame.CreateVector(variable::FSIG, type::FREQ_CPLX_VECTOR, 2, 9));
        ASSERT_TRUE(frame.CreateVector(variable::SGAIN, type::FREQ_REAL_MONO_VECTOR, 4, 9));
        ASSERT_TRUE(frame.CreateScalar(variable::MASK, type::INT_SCALAR));
        EXPECT_EQ(pool.InUse(), 2u);
        EXPECT_EQ(frame.Find(variable::SGAIN)->rows, 1u);  // mono whatever was asked

        EXPECT_FALSE(frame.CreateVector(variable::FSIG, type::FREQ_CPLX_VECTOR, 2, 9));
        ASSERT_EQ(checks.Checks().size(), 1u);
        EXPECT_EQ(checks.Checks()[0], "Find(var_id) == nullptr");

        EXPECT_EQ(frame.Real(variable::FSIG, type::FREQ_REAL_VECTOR), nullptr);
        ASSERT_EQ(checks.Checks().size(), 2u);
        EXPECT_EQ(checks.Checks()[1], "v->TypeOf() == type_id");
        EXPECT_EQ(frame.Real(variable::TGRAD, type::FREQ_REAL_VECTOR), nullptr);  // absent: no check

        Complex* fsig = frame.Cplx(variable::FSIG, type::FREQ_CPLX_VECTOR);
        ASSERT_NE(fsig, nullptr);
        for (std::size_t i = 0; i < 18; ++i) EXPECT_EQ(fsig[i], Complex{});  // zeroed, 2 rows of 9
        *frame.Int(variable::MASK) = 5;
        EXPECT_EQ(*frame.Int(variable::MASK), 5);

        // Re-requiring a shared variable accepts only the same type and shape.
        EXPECT_TRUE(frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, 2, 9));
        EXPECT_FALSE(frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, 3, 9));
    }
    EXPECT_EQ(pool.InUse(), 0u);  // the frame gave everything back
}

TEST(Frame, DumpListsEveryVariable) {
    Pool pool;
    Frame frame(pool);
    frame.CreateScalar(variable::MASK, type::INT_SCALAR);
    frame.CreateScalar(variable::TIME_SCALE, type::REAL_SCALAR);
    frame.CreateVector(variable::PHASE_IN, type::FREQ_REAL_VECTOR, 1, 4);
    *frame.Int(variable::MASK) = 3;
    *frame.Scalar(variable::TIME_SCALE) = 1.5;
    const std::string dump = DumpOf(frame);
    EXPECT_EQ(dump.rfind("---- Frame 0x", 0), 0u) << dump;
    EXPECT_NE(dump.find("[PHASE_IN, FREQ_REAL_VECTOR]: 0x"), std::string::npos) << dump;
    EXPECT_NE(dump.find("[MASK, INT_SCALAR]: 3\n"), std::string::npos) << dump;
    EXPECT_NE(dump.find("[TIME_SCALE, REAL_SCALAR]: 1.500000\n"), std::string::npos) << dump;
    EXPECT_STREQ(TypeName(type::LastId), "Invalid");
    EXPECT_STREQ(VariableName(variable::LastId), "Invalid");
}

TEST(Pool, RunsOutAtItsCapacityAndTakesBackOnlyItsOwn) {
    Pool pool;
    std::vector<float*> taken;
    for (std::size_t i = 0; i < Pool::kCapacity; ++i) taken.push_back(pool.Allocate(8));
    EXPECT_EQ(pool.Allocate(8), nullptr);
    float stranger = 0.0f;
    EXPECT_FALSE(pool.Free(&stranger));
    EXPECT_TRUE(pool.Free(taken[3]));
    EXPECT_FALSE(pool.Free(taken[3]));
    EXPECT_NE(pool.Allocate(8), nullptr);
    for (float* v : taken) pool.Free(v);
}


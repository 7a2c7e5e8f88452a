// Silence and tails, DC, full-scale noise, impulses, sines near Nyquist,
// non-finite, huge and denormal input, and the meters that read them.
#pragma once

#include "ValidationContext.h"

namespace zenfx {

class SignalChecks {
public:
    // A tail or latency longer than this is not believed.
    static constexpr double kLongestTailSeconds = 60.0;
    // Denormal-range input may cost at most this many times normal input.
    static constexpr double kDenormalSlowdownLimit = 2.0;

    explicit SignalChecks(ValidationContext& context) : m_context(context) {}
    void Run();

private:
    CheckOutcome Silence();
    CheckOutcome Tail();
    CheckOutcome Stress(const std::string& what, const std::function<Planar(std::uint32_t width, double rate)>& make);
    enum class Shape { OneSample, Burst, WholeBlock };

    CheckOutcome NonFinite();
    CheckOutcome Huge();
    // `values` in each shape into noise, at every check rate with the
    // defaults and a random setting: the output must stay finite, and with
    // `boundedAfter` be sane one block plus the latency later. Returns the
    // number of cases.
    int Poisoned(const std::vector<float>& values, const std::vector<Shape>& shapes, bool boundedAfter);
    CheckOutcome Denormals();
    CheckOutcome Meters();

    ValidationContext& m_context;
};

}  // namespace zenfx

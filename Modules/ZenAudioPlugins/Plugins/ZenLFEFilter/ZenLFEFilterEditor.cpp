// Editor of "LFE Filter": the low-pass as the plug-in designs it (its
// sections' Qs for the type and slope, each a BiQuad low-pass at the
// cut-off).
#include <array>
#include <cmath>
#include <memory>

#include "Common/Algorithms/BiQuad.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenLFEFilter.h"

namespace {

constexpr int kResponsePoints = 200;

struct LowPass {
    float rate = 0.0f;
    std::array<BiQuad, ZenLFEFilter::kMaxSections> sections;

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        if (link.GetSampleRate() != rate) {
            rate = link.GetSampleRate();
            for (BiQuad& s : sections) s.Prepare(rate, 1);
        }
        const auto type = static_cast<ZenLFEFilter::Type>(std::lround(link.GetParameter(ZenLFEFilter::kType)));
        const auto slope = static_cast<ZenLFEFilter::Slope>(std::lround(link.GetParameter(ZenLFEFilter::kSlope)));
        const auto q = ZenLFEFilter::SectionQs(type, slope);
        FilterResponse response(rate);
        for (std::size_t k = 0; k < sections.size(); ++k) {
            if (!(q[k] > 0.0)) continue;
            BiQuad& s = sections[k];
            s.SetParameter(BiQuad::kShape, static_cast<float>(BiQuad::kLowPass));
            s.SetParameter(BiQuad::kQ, static_cast<float>(q[k]));
            s.SetParameter(BiQuad::kFreq, link.GetParameter(ZenLFEFilter::kCutoff));
            s.SetParameter(BiQuad::kIn, 1.0f);
            response.Add(s.GetCoefficients());
        }
        display.SetCurve(0, response.Curve(display.Plot().SamplePositions(kResponsePoints)), "Low-Pass");
    }
};

void BuildLFEFilterEditor(ZenEditor& editor) {
    auto lowPass = std::make_shared<LowPass>();
    auto response = new CurveDisplay(
        "Response", [lowPass](const zen::EditorLink& link, CurveDisplay& display) { lowPass->Update(link, display); });
    response->Plot().SetHorizontal(10.0, 1000.0, PlotArea::Scale::Logarithmic, "Hz");
    response->Plot().SetVertical(-60.0, 6.0, "dB");
    editor.AddDisplay(response);
    editor.AddGroup("Filter", {"CUTOFF", "TYPE", "SLOPE"});
    editor.AddGroup("Routing", {"CHANNEL"});
    editor.AddMeters("Output", {"LFE_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenLFEFilter", &BuildLFEFilterEditor);

}  // namespace

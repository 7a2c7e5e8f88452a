// The reverb's decay time across frequency: for each line of the feedback
// network, the time its loop gain (gain per pass times the damping low-pass)
// takes to fall 60 dB, averaged over the lines. The settings come from an
// engine of the reverb fed with the live parameters, so the curve is the
// decay that runs.
#pragma once

#include <functional>
#include <memory>

#include "Common/Reverb/zn_reverb.h"
#include "CurveDisplay.h"

class DecayDisplay : public CurveDisplay {
    Q_OBJECT

public:
    // Writes the live parameters into the engine's record (the plug-in's own
    // mapping of parameters to record entries).
    using RecordSetter = std::function<void(const zen::EditorLink& link, zen::reverb::zn_reverb& engine)>;

    static constexpr int kCurvePoints = 96;

    DecayDisplay(const QString& title, RecordSetter setter, QWidget* parent = nullptr);
    ~DecayDisplay() override;

    // Seconds to fall 60 dB at `frequency` (Hz) for a loop of `laneSeconds`
    // with gain per pass `gain` and damping `coefficient`
    // (y = (1 + c) x - c y[n-1]) at `engineRate`.
    static double LaneT60(double gain, double coefficient, double laneSeconds, double frequency, double engineRate);
    // The mean over the engine's lines; its steps must have run.
    static double T60At(const zen::reverb::zn_reverb& engine, double frequency);

    // The engine after the last refresh (tests).
    const zen::reverb::zn_reverb* Engine() const { return m_engine.get(); }

private:
    void Read(const zen::EditorLink& link);

    RecordSetter m_setter;
    std::unique_ptr<zen::reverb::zn_reverb> m_engine;
    float m_hostRate = 0.0f;
    double m_shownMaximum = 0.0;
};

// The rate of a plug-in's LFOs: free in Hz, or one cycle per note value of a
// "Tempo" when a "Sync" note is chosen (see NoteValue). Plain value type.
#pragma once

#include <cmath>

#include "Lfo.h"
#include "NoteValue.h"

class LfoRate {
public:
    void SetHertz(float hertz) { m_hertz = hertz; }
    void SetSync(float noteValue) { m_sync = static_cast<int>(std::lround(noteValue)); }
    void SetTempo(float bpm) { m_tempo = bpm; }

    double Hertz() const { return m_sync > 0 ? Lfo::SyncedRate(m_tempo, zen::NoteValueBeats(m_sync)) : m_hertz; }

private:
    float m_hertz = 1.0f;
    int m_sync = 0;
    float m_tempo = 120.0f;
};

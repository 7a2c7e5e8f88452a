#include "Support/DecayAnalysis.h"

#include <cmath>

#include "Common/Algorithms/BiQuad.h"

namespace zentest {

std::vector<float> OctaveBand(const std::vector<float>& x, double centre, double sampleRate) {
    // Q of a one-octave band: sqrt(2); two sections steepen the skirts.
    constexpr double kOctaveQ = 1.4142135623730951;
    std::vector<float> y = x;
    for (int section = 0; section < 2; ++section) {
        BiQuad band;
        band.Prepare(static_cast<float>(sampleRate), 1024);
        band.SetParameter(BiQuad::kIn, 1.0f);
        band.SetBandPass(centre, kOctaveQ);
        band.ProcessChannel(0, y.data(), y.size());
    }
    return y;
}

std::vector<double> SchroederCurve(const std::vector<float>& x) {
    std::vector<double> energy(x.size());
    double sum = 0.0;
    for (std::size_t i = x.size(); i-- > 0;) {
        sum += double(x[i]) * double(x[i]);
        energy[i] = sum;
    }
    const double total = energy.empty() ? 1.0 : energy[0];
    for (double& e : energy) e = 10.0 * std::log10(std::max(e / total, 1e-300));
    return energy;
}

double DecayTime(const std::vector<float>& x, double sampleRate, double fromDb, double toDb) {
    const std::vector<double> curve = SchroederCurve(x);
    std::size_t begin = 0;
    while (begin < curve.size() && curve[begin] > fromDb) ++begin;
    std::size_t end = begin;
    while (end < curve.size() && curve[end] > toDb) ++end;
    if (end >= curve.size() || end <= begin + 1) return 0.0;
    // Least squares of dB over seconds.
    double st = 0.0, sy = 0.0, stt = 0.0, sty = 0.0;
    const double n = double(end - begin);
    for (std::size_t i = begin; i < end; ++i) {
        const double t = double(i) / sampleRate;
        st += t;
        sy += curve[i];
        stt += t * t;
        sty += t * curve[i];
    }
    const double slope = (n * sty - st * sy) / (n * stt - st * st);
    return slope < 0.0 ? -60.0 / slope : 0.0;
}

double BandDecayTime(const std::vector<float>& x, double centre, double sampleRate) {
    return DecayTime(OctaveBand(x, centre, sampleRate), sampleRate);
}

}  // namespace zentest

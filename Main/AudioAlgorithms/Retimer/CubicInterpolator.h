// Four-point cubic (Catmull-Rom) interpolation: passes through the samples,
// continuous in slope, and at a whole position returns the sample itself,
// so reading at rate 1 is transparent.
#pragma once

namespace ora::retimer::interp {

class cubic {
public:
    // Between x0 (frac 0) and x1 (frac 1), with neighbours xm1 and x2.
    static float Interpolate(float xm1, float x0, float x1, float x2, float frac) noexcept {
        const float c1 = 0.5f * (x1 - xm1);
        const float c2 = xm1 - 2.5f * x0 + 2.0f * x1 - 0.5f * x2;
        const float c3 = 0.5f * (x2 - xm1) + 1.5f * (x0 - x1);
        return ((c3 * frac + c2) * frac + c1) * frac + x0;
    }

    void SetInvRate(double invRate) { m_invRate = invRate; }
    double InvRate() const { return m_invRate; }

private:
    double m_invRate = 1.0;
};

}  // namespace ora::retimer::interp

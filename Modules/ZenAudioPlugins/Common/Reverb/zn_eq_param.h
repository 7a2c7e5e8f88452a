// Settings of the two-band tone control: a low shelf and a high shelf, each
// frequency (Hz), linear gain and shape (the shelf's Q).
#pragma once

namespace zen::reverb {

struct zn_eq_param {
    struct Band {
        float frequency;
        float gain;
        float shape;
        bool operator==(const Band& o) const { return frequency == o.frequency && gain == o.gain && shape == o.shape; }
        bool operator!=(const Band& o) const { return !(*this == o); }
    };

    static constexpr float kDefaultShape = 0.3333333f;

    Band low{300.0f, 1.0f, kDefaultShape};
    Band high{10000.0f, 1.0f, kDefaultShape};
};

}  // namespace zen::reverb

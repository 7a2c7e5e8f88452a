/* The fvad_* contract as a C host sees it: this file is compiled as C,
 * includes nothing of the library but zen/fvad.h and links the shared
 * library. Every return value of every function is met on real frames. */
#include <math.h>
#include <stdio.h>
#include <stdlib.h>

#include "zen/fvad.h"

static int failures = 0;
static int checks = 0;

#define EXPECT_EQ(actual, expected)                                                         \
    do {                                                                                    \
        long a_ = (long)(actual), e_ = (long)(expected);                                    \
        ++checks;                                                                           \
        if (a_ != e_) {                                                                     \
            ++failures;                                                                     \
            fprintf(stderr, "%s:%d: %s is %ld, expected %ld\n", __FILE__, __LINE__, #actual, a_, e_); \
        }                                                                                   \
    } while (0)

static const int kRates[] = {8000, 16000, 32000, 48000};
static const double kPi = 3.14159265358979323846;

/* A sustained vowel: harmonics of 120 Hz shaped by formants near 700, 1200
 * and 2600 Hz, peaking near -6 dBFS. */
static void Vowel(int16_t* out, size_t length, int rate, size_t start) {
    const double formants[3] = {700.0, 1200.0, 2600.0};
    const double f0 = 120.0;
    double peak = 0.0;
    double* x = malloc(length * sizeof(double));
    for (size_t n = 0; n < length; ++n) {
        const double t = (double)(start + n) / rate;
        double s = 0.0;
        for (int h = 1; h * f0 < 3800.0 && h * f0 < rate / 2.0; ++h) {
            double gain = 0.02;
            for (int f = 0; f < 3; ++f) {
                const double d = (h * f0 - formants[f]) / 150.0;
                gain += exp(-d * d) / (f + 1);
            }
            s += gain * sin(2.0 * kPi * h * f0 * t);
        }
        x[n] = s;
    }
    for (size_t n = 0; n < length; ++n) peak = fabs(x[n]) > peak ? fabs(x[n]) : peak;
    for (size_t n = 0; n < length; ++n) out[n] = (int16_t)(x[n] / (peak > 0.0 ? peak : 1.0) * 2.0 * 8192.0);
    free(x);
}

/* Runs `seconds` of vowel (or silence) in frames of `ms` and counts the
 * frames decided as voice; -1 when any decision is neither 0 nor 1. */
static int VoiceFrames(Fvad* vad, int rate, int ms, int seconds, int voiced) {
    const size_t length = (size_t)(rate / 1000 * ms);
    int16_t* frame = calloc(length, sizeof(int16_t));
    int voice = 0;
    for (size_t start = 0; start + length <= (size_t)(rate * seconds); start += length) {
        if (voiced) Vowel(frame, length, rate, start);
        const int decision = fvad_process(vad, frame, length);
        if (decision != 0 && decision != 1) {
            voice = -1;
            break;
        }
        voice += decision;
    }
    free(frame);
    return voice;
}

int main(void) {
    Fvad* vad = fvad_new();
    if (vad == NULL) {
        fprintf(stderr, "fvad_new returned NULL\n");
        return 1;
    }

    for (int mode = 0; mode <= 3; ++mode) EXPECT_EQ(fvad_set_mode(vad, mode), 0);
    EXPECT_EQ(fvad_set_mode(vad, -1), -1);
    EXPECT_EQ(fvad_set_mode(vad, 4), -1);

    const int badRates[] = {0, -8000, 11025, 22050, 44100, 96000};
    for (size_t i = 0; i < sizeof badRates / sizeof badRates[0]; ++i)
        EXPECT_EQ(fvad_set_sample_rate(vad, badRates[i]), -1);

    for (size_t r = 0; r < 4; ++r) {
        const int rate = kRates[r];
        for (int ms = 10; ms <= 30; ms += 10) {
            /* Silence is no voice, frame after frame; a vowel is voice. A
             * reset drops the hang-over of the previous vowel. */
            fvad_reset(vad);
            EXPECT_EQ(fvad_set_sample_rate(vad, rate), 0);
            EXPECT_EQ(fvad_set_mode(vad, 1), 0);
            EXPECT_EQ(VoiceFrames(vad, rate, ms, 1, 0), 0);
            const int frames = 1000 / ms;
            const int voice = VoiceFrames(vad, rate, ms, 1, 1);
            if (voice < frames * 9 / 10) {
                ++failures;
                fprintf(stderr, "%d Hz, %d ms: %d of %d vowel frames taken for voice\n", rate, ms, voice, frames);
            }
            ++checks;
        }
        /* Lengths other than 10, 20 and 30 ms are refused, as is no frame. */
        int16_t frame[3 * 480 + 1] = {0};
        const size_t tenMs = (size_t)(rate / 100);
        const size_t badLengths[] = {0, 1, tenMs - 1, tenMs + 1, 4 * tenMs, 3 * tenMs + 1};
        for (size_t i = 0; i < sizeof badLengths / sizeof badLengths[0]; ++i)
            if (badLengths[i] <= sizeof frame / sizeof frame[0]) EXPECT_EQ(fvad_process(vad, frame, badLengths[i]), -1);
        EXPECT_EQ(fvad_process(vad, NULL, tenMs), -1);
    }

    /* A refused rate leaves the one set before; reset returns to 8000 Hz. */
    fvad_reset(vad);
    EXPECT_EQ(fvad_set_sample_rate(vad, 48000), 0);
    EXPECT_EQ(fvad_set_sample_rate(vad, 44100), -1);
    int16_t frame[480] = {0};
    EXPECT_EQ(fvad_process(vad, frame, 480), 0);
    fvad_reset(vad);
    EXPECT_EQ(fvad_process(vad, frame, 480), -1);
    EXPECT_EQ(fvad_process(vad, frame, 80), 0);

    fvad_free(vad);
    fvad_free(NULL);

    printf("%d passed, %d failed\n", checks - failures, failures);
    return failures == 0 ? 0 : 1;
}

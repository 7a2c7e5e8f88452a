/* Voice-activity detection with libfvad's C interface, exported by
 * libZenAudioPlugins.so under libfvad's own names. C and C++ hosts include
 * this header alone and link the library.
 *
 * An instance is used by one thread at a time; different instances are
 * independent. fvad_process neither allocates, locks nor blocks, so it may
 * run on an audio thread; fvad_new and fvad_free allocate and free.
 */
#ifndef ZEN_FVAD_H
#define ZEN_FVAD_H

#include <stddef.h>
#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

#if defined(__GNUC__)
#define ZEN_FVAD_EXPORT __attribute__((visibility("default")))
#else
#define ZEN_FVAD_EXPORT
#endif

typedef struct Fvad Fvad;

/* A new detector in mode 0 at 8000 Hz, or NULL when memory runs out.
 * Give it back with fvad_free. */
ZEN_FVAD_EXPORT Fvad* fvad_new(void);

/* Frees a detector made by fvad_new; NULL is ignored. */
ZEN_FVAD_EXPORT void fvad_free(Fvad* inst);

/* Clears every state and returns mode and sample rate to their defaults
 * (mode 0, 8000 Hz). */
ZEN_FVAD_EXPORT void fvad_reset(Fvad* inst);

/* Aggressiveness: 0 (least, the default; fewest missed speech frames) to 3
 * (most; fewest noise frames taken for speech). Returns 0, or -1 with the
 * mode unchanged for any other value. */
ZEN_FVAD_EXPORT int fvad_set_mode(Fvad* inst, int mode);

/* Rate of the frames given to fvad_process: 8000 (the default), 16000,
 * 32000 or 48000 Hz. Returns 0, or -1 with the rate unchanged for any other
 * value. */
ZEN_FVAD_EXPORT int fvad_set_sample_rate(Fvad* inst, int sample_rate);

/* Decides one frame of `length` signed 16-bit samples at the set rate; the
 * frame lasts 10, 20 or 30 ms (80, 160 or 240 samples at 8000 Hz). Returns 1
 * for voice, 0 for no voice, -1 for any other length (or a NULL frame). The
 * decision takes the frames before it into account. */
ZEN_FVAD_EXPORT int fvad_process(Fvad* inst, const int16_t* frame, size_t length);

#ifdef __cplusplus
}
#endif

#endif /* ZEN_FVAD_H */

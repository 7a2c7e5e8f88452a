#!/bin/sh
# Noise reduction compared with speexdsp's preprocessor and ffmpeg's afftdn
# on espeak-ng speech in four noises at three SNRs; prints Markdown tables.
# Needs (Debian): libspeexdsp-dev ffmpeg espeak-ng. Not part of make test.
set -eu
BUILD_DIR=${BUILD_DIR:-build}
for tool in ffmpeg espeak-ng; do
  command -v "$tool" >/dev/null 2>&1 || { echo "error: $tool is missing (apt-get install $tool)" >&2; exit 1; }
done
pkg-config --exists speexdsp || { echo "error: libspeexdsp-dev is missing (apt-get install libspeexdsp-dev)" >&2; exit 1; }
cmake -S . -B "$BUILD_DIR" -G Ninja >/dev/null
cmake --build "$BUILD_DIR" --target ZenNoiseComparison -j "${JOBS:-2}"
"$BUILD_DIR/bin/ZenNoiseComparison"

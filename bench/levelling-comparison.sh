#!/bin/sh
# "Dialogue Leveller" compared with ffmpeg's loudnorm (dynamic mode) on
# espeak-ng dialogue at -38 to -14 LUFS; prints a Markdown table.
# Needs (Debian): ffmpeg espeak-ng. Not part of make test.
set -eu
BUILD_DIR=${BUILD_DIR:-build}
for tool in ffmpeg espeak-ng; do
  command -v "$tool" >/dev/null 2>&1 || { echo "error: $tool is missing (apt-get install $tool)" >&2; exit 1; }
done
cmake -S . -B "$BUILD_DIR" -G Ninja >/dev/null
cmake --build "$BUILD_DIR" --target ZenLevellingComparison zenfx ZenAudioPlugins -j "${JOBS:-2}"
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
"$BUILD_DIR/bin/ZenLevellingComparison" "$BUILD_DIR/bin/zenfx" "$scratch"

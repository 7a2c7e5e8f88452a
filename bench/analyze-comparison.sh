#!/bin/bash
# zenfx analyze beside ffmpeg's ebur128 filter (true peak on) on the same
# file, in one run: wall and CPU time, realtime factors and both readings.
# The file is 5 minutes of stereo 24-bit programme-like noise at 48 kHz
# unless one is given. Needs (Debian): ffmpeg. Not part of make test.
#   bench/analyze-comparison.sh [FILE]
set -euo pipefail
BUILD_DIR=${BUILD_DIR:-build}
command -v ffmpeg >/dev/null 2>&1 || { echo "error: ffmpeg is missing (apt-get install ffmpeg)" >&2; exit 1; }
cmake -S . -B "$BUILD_DIR" -G Ninja >/dev/null
cmake --build "$BUILD_DIR" --target zenfx ZenAudioPlugins -j "${JOBS:-2}" >/dev/null
ZENFX="$BUILD_DIR/bin/zenfx"

WORK=$(mktemp -d)
trap 'rm -rf "$WORK"' EXIT
FILE=${1:-}
if [ -z "$FILE" ]; then
  FILE="$WORK/programme.wav"
  # Pink noise whose level swings slowly, partly shared by the channels:
  # something for the range and the correlation to read.
  ffmpeg -nostdin -loglevel error \
    -f lavfi -i "anoisesrc=color=pink:sample_rate=48000:duration=300:amplitude=0.3:seed=1" \
    -f lavfi -i "anoisesrc=color=pink:sample_rate=48000:duration=300:amplitude=0.3:seed=2" \
    -filter_complex "[0][1]amerge=inputs=2,pan=stereo|c0=c0|c1=0.6*c0+0.8*c1,volume='0.5+0.4*sin(2*PI*t/40)':eval=frame" \
    -c:a pcm_s24le "$FILE"
fi
SECONDS_OF_AUDIO=$(ffprobe -v error -show_entries format=duration -of csv=p=0 "$FILE")

[ -x /usr/bin/time ] || { echo "error: /usr/bin/time is missing (apt-get install time)" >&2; exit 1; }
# Runs a command with its output in $WORK/out and $WORK/err; prints "wall cpu" in seconds.
measure() {
  /usr/bin/time -o "$WORK/time" -f "%e %U %S" "$@" >"$WORK/out" 2>"$WORK/err"
  awk '{printf "%.2f %.2f\n", $1, $2 + $3}' "$WORK/time"
}

read -r FF_WALL FF_CPU < <(measure ffmpeg -nostdin -hide_banner -nostats -i "$FILE" -af ebur128=peak=true -f null -)
FF_SUMMARY=$(grep -A 14 "Summary:" "$WORK/err" | sed 's/^\[.*\] //')
read -r ZF_WALL ZF_CPU < <(measure "$ZENFX" analyze "$FILE")
ZF_REPORT=$(cat "$WORK/out")

rate() { awk -v a="$SECONDS_OF_AUDIO" -v b="$1" 'BEGIN {printf "%.0f", a / b}'; }
ratio() { awk -v a="$1" -v b="$2" 'BEGIN {printf "%.2f", a / b}'; }
echo "File: $FILE ($SECONDS_OF_AUDIO s)"
echo
echo "| tool | wall s | cpu s | realtime (cpu) |"
echo "|---|---|---|---|"
echo "| ffmpeg ebur128=peak=true | $FF_WALL | $FF_CPU | $(rate "$FF_CPU")x |"
echo "| zenfx analyze | $ZF_WALL | $ZF_CPU | $(rate "$ZF_CPU")x |"
echo
echo "zenfx analyze is $(ratio "$FF_CPU" "$ZF_CPU")x faster in CPU time, $(ratio "$FF_WALL" "$ZF_WALL")x in wall time."
echo
echo "ffmpeg:"
echo "$FF_SUMMARY"
echo
echo "zenfx:"
echo "$ZF_REPORT"

#!/bin/sh
# make compare: our plug-ins beside the best open peers Debian packages, on
# the same material (built by ZenPeerQuality), printed as one Markdown table.
# CPU: LV2 plug-ins timed in one lilv host (ZenLv2Comparison, net of the
# host's own cost); pitch shifters timed as whole processes on the same file.
# Quality: the figure that matters for each job. The peers are yardsticks,
# installed from Debian here and never linked. Not part of make test.
#
#   bench/peers.sh [BUILD_DIR]     (as root it installs the peers it misses)
set -eu

BUILD=${1:-build}
PEERS="lv2file x42-plugins lsp-plugins-lv2 calf-plugins dragonfly-reverb-lv2 rubberband-cli sox ffmpeg"

missing=""
for package in $PEERS; do
    dpkg -s "$package" >/dev/null 2>&1 || missing="$missing $package"
done
if [ -n "$missing" ]; then
    if [ "$(id -u)" -eq 0 ]; then
        echo "installing the yardsticks:$missing" >&2
        DEBIAN_FRONTEND=noninteractive apt-get install -y --no-install-recommends $missing >/dev/null
    else
        echo "not root: comparing without$missing" >&2
    fi
fi

cmake --build "$BUILD" --target zenfx zen_lv2_ttl ZenLv2Comparison ZenPeerQuality >/dev/null
QUALITY="$BUILD/bin/ZenPeerQuality"
ZENFX="$BUILD/bin/zenfx"
export LV2_PATH="$PWD/$BUILD/lib/lv2:/usr/lib/lv2"

WORK=$(mktemp -d)
trap 'rm -rf "$WORK"' EXIT INT TERM HUP
"$QUALITY" material "$WORK"

has_plugin() { lv2info "$1" >/dev/null 2>&1; }

# render URI INPUT OUTPUT [symbol:value ...]: lv2file in blocks of 512, else
# lilv's lv2apply (one frame per block) for plug-ins lv2file cannot run.
render() {
    uri=$1 input=$2 output=$3
    shift 3
    file_args="" apply_args=""
    for setting in "$@"; do
        file_args="$file_args -p $setting"
        apply_args="$apply_args -c $(echo "$setting" | tr ':' ' ')"
    done
    lv2file -b 512 --ignore-clipping $file_args -i "$input" -o "$output" "$uri" >/dev/null 2>&1 ||
        lv2apply $apply_args -i "$input" -o "$output" "$uri" >/dev/null 2>&1
}

# The jobs: job | name | URI | settings (symbol:value) | quality kind
ZEN=urn:zenaudioplugins
cat >"$WORK/jobs" <<EOF
true-peak limiter|ours: Limiter|$ZEN:Limiter:1517177970:stereo|threshold:-1|limiter
true-peak limiter|x42-dpl (true peak on)|http://gareus.org/oss/lv2/dpl#stereo|threshold:-1 truepeak:1|limiter
true-peak limiter|LSP Limiter (no oversampling)|http://lsp-plug.in/plugins/lv2/limiter_stereo|th:0.891251 ovs:0|limiter
de-esser|ours: De-Esser|$ZEN:De-Esser:1516596851:stereo||deesser
de-esser|Calf Deesser|http://calf.sourceforge.net/plugins/Deesser||deesser
reverb (T60 2 s)|ours: Reverb|$ZEN:Reverb:1517179490:stereo|t60:2 dry_wet:100|reverb
reverb (T60 2 s)|Calf Reverb|http://calf.sourceforge.net/plugins/Reverb|decay_time:2 dry:0 amount:1|reverb
reverb (T60 2 s)|Dragonfly Room|urn:dragonfly:room|decay:2 dry_level:0|reverb
soft clipper|ours: Soft Clipper|$ZEN:Soft%20Clipper:1517179747:stereo||none
soft clipper|Calf Saturator|http://calf.sourceforge.net/plugins/Saturator||none
EOF

# CPU of every LV2 subject in one run, so a busy machine weighs on all alike.
set --
while IFS='|' read -r job name uri settings kind; do
    has_plugin "$uri" || continue
    set -- "$@" "$uri"
    for setting in $settings; do set -- "$@" "$(echo "$setting" | tr ':' '=')"; done
done <"$WORK/jobs"
"$BUILD/bin/ZenLv2Comparison" --seconds 10 --rounds 5 "$@" >"$WORK/cpu"

cpu_of() { awk -v uri="$1" '$1 == uri { sub("x", "", $3); print $3 }' "$WORK/cpu"; }

echo "| job | plug-in | net realtime x (median) | quality |"
echo "|---|---|---|---|"
while IFS='|' read -r job name uri settings kind; do
    if ! has_plugin "$uri"; then
        echo "| $job | $name | not installed | |"
        continue
    fi
    quality="no LV2 host here runs it (lv2file, lv2apply)"
    case $kind in
        limiter)
            render "$uri" "$WORK/pink.wav" "$WORK/out-pink.wav" $settings &&
            render "$uri" "$WORK/music.wav" "$WORK/out-music.wav" $settings &&
            quality="pink: $("$QUALITY" truepeak -1 "$WORK/out-pink.wav" | tr '\t' ' ') windows over; music: $("$QUALITY" truepeak -1 "$WORK/out-music.wav" | tr '\t' ' ') windows over"
            ;;
        deesser)
            render "$uri" "$WORK/speech.wav" "$WORK/out-speech.wav" $settings &&
            quality=$("$QUALITY" bands "$WORK/out-speech.wav" | tr '\t' ' ')
            ;;
        reverb)
            render "$uri" "$WORK/impulse.wav" "$WORK/out-impulse.wav" $settings &&
            quality="T60 $("$QUALITY" t60 2 "$WORK/out-impulse.wav" | tr '\t' ' ')"
            ;;
        *) quality="" ;;
    esac
    cpu=$(cpu_of "$uri")
    echo "| $job | $name | ${cpu:-not run (needs a host feature)} | $quality |"
done <"$WORK/jobs"

# Pitch +3 semitones as whole processes on 30 s of stereo music, and the
# tone bursts for cents and alignment (0 samples: in time with the input).
seconds_of() { awk 'NR == 1 { start = $1 } END { printf "%.1f", 30 / ($1 - start) }'; }
pitch_row() {
    name=$1 tool=$2
    shift 2
    start=$(date +%s.%N)
    if "$@" "$WORK/music.wav" "$WORK/out-music.wav" >/dev/null 2>&1; then
        end=$(date +%s.%N)
        "$@" "$WORK/tone.wav" "$WORK/out-tone.wav" >/dev/null 2>&1
        factor=$(printf '%s\n%s\n' "$start" "$end" | seconds_of)
        echo "| pitch +3 st | $name | $factor (whole process) | $("$QUALITY" pitch 3 "$WORK/tone.wav" "$WORK/out-tone.wav" | tr '\t' ' ') |"
    else
        echo "| pitch +3 st | $name | not installed | |"
    fi
}
zen_pitch() { "$ZENFX" process "$1" -o "$2" --plugin Pitch --set Semitones=3; }
rubberband_r2() { rubberband -p 3 "$1" "$2"; }
rubberband_r3() { rubberband -3 -p 3 "$1" "$2"; }
sox_pitch() { sox "$1" "$2" pitch 300; }
pitch_row "ours: Pitch (zenfx)" zenfx zen_pitch
command -v rubberband >/dev/null && pitch_row "Rubber Band R2" rubberband rubberband_r2
command -v rubberband >/dev/null && pitch_row "Rubber Band R3" rubberband rubberband_r3
command -v sox >/dev/null && pitch_row "sox pitch" sox sox_pitch

#!/bin/sh
# Realtime factors of "Delay", "Chorus", "Flanger" and "Modulation" (phaser)
# beside Calf's Vintage Delay, Multi Chorus, Flanger and Phaser, each at its
# defaults, in one LV2 host (bench/Lv2Comparison). Needs (Debian):
# calf-plugins, installed by hand as a yardstick only. Not part of make test.
set -eu
BUILD_DIR=${BUILD_DIR:-build}
[ -d /usr/lib/lv2/calf.lv2 ] || { echo "error: calf-plugins is missing (apt-get install calf-plugins)" >&2; exit 1; }
cmake -S . -B "$BUILD_DIR" -G Ninja >/dev/null
cmake --build "$BUILD_DIR" --target ZenLv2Comparison zen_lv2 zen_lv2_ttl -j "${JOBS:-2}"
export LV2_PATH="$(cd "$BUILD_DIR" && pwd)/lib/lv2:/usr/lib/lv2"
CALF=http://calf.sourceforge.net/plugins
ZEN=urn:zenaudioplugins
for pair in "Delay:1516596857 VintageDelay" "Chorus:1516596857 MultiChorus" "Flanger:1516596857 Flanger" \
            "Modulation:1517178220 Phaser"; do
  set -- $pair
  "$BUILD_DIR/bin/ZenLv2Comparison" --seconds "${SECONDS_PER_ROUND:-5}" --rounds "${ROUNDS:-3}" \
    "$ZEN:$1:stereo" "$CALF/$2"
done

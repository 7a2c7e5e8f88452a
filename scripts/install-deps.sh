#!/bin/sh
# Installs the Debian packages the build, the hosts and the tests need.
# Only missing packages are fetched, so a second run costs a dpkg query.
set -eu

PACKAGES="
  build-essential cmake ninja-build pkg-config binutils ccache
  qtbase5-dev qtbase5-dev-tools
  libboost-dev libboost-thread-dev libboost-system-dev
  libpugixml-dev
  libkissfft-dev libfftw3-dev
  libwebrtc-audio-processing-dev
  libsndfile1-dev
  espeak-ng
  libcli11-dev nlohmann-json3-dev
  lv2-dev liblilv-dev lilv-utils sordi
  googletest libgtest-dev libgmock-dev libbenchmark-dev
  libebur128-dev alsa-utils
  jalv jackd2 xvfb xauth jq
"

missing=""
for p in $PACKAGES; do
  if ! dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed"; then
    missing="$missing $p"
  fi
done

if [ -z "$missing" ]; then
  exit 0
fi

echo "Installing:$missing"
SUDO=""
if [ "$(id -u)" -ne 0 ]; then
  if command -v sudo >/dev/null 2>&1; then
    SUDO="sudo"
  else
    echo "error: missing packages ($missing) and not root; run as root or install them" >&2
    exit 1
  fi
fi
export DEBIAN_FRONTEND=noninteractive
$SUDO apt-get update -qq
# shellcheck disable=SC2086
$SUDO apt-get install -y -qq --no-install-recommends $missing

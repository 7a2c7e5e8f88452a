#!/bin/sh
# make screenshots: a picture of every plug-in's editor in docs/editors/
# (<Class>.png, at 100 %; a few again at 200 % in docs/editors/2x/) and the
# README's "Editors" gallery linking them. Audio plug-ins are pictured after
# 3 s of the demo material, control plug-ins as they open. Same build, same
# pictures: the command renders offscreen, its refreshes are counted, not
# timed.
#
#   scripts/screenshots.sh BUILD_DIR [JOBS]
set -eu

BUILD_DIR=${1:-build}
JOBS=${2:-2}
ZENFX="$BUILD_DIR/bin/zenfx"
OUT=docs/editors
# Pictured again at 200 %: the busiest editors, where clipped text would show first.
DOUBLE="ZenLimiter ZenMultiBandCompressor ZenReverb ZenMeter"

[ -x "$ZENFX" ] || { echo "screenshots: $ZENFX is missing; build first" >&2; exit 1; }
mkdir -p "$OUT/2x"

# One line per plug-in: file name, key, display name. Audio plug-ins are
# named by class (rows that share a class, the levelling templates, get the
# first row's picture), control plug-ins by key without spaces.
list=$(mktemp)
trap 'rm -f "$list"' EXIT
"$ZENFX" list --json | jq -r '
  .[] | [ (if .class then .class else (.key | gsub("[^A-Za-z0-9]"; "")) end), .key, .name ] | @tsv' |
  awk -F'\t' '!seen[$1]++' >"$list"

# Every picture as one zenfx call, JOBS at a time.
{
  while IFS="$(printf '\t')" read -r file key name; do
    printf '%s\0%s\0' "$key" "$OUT/$file.png"
    case " $DOUBLE " in *" $file "*) printf '%s\0%s\0' "$key" "$OUT/2x/$file.png" ;; esac
  done <"$list"
} | xargs -0 -n 2 -P "$JOBS" sh -c '
  case "$2" in */2x/*) scale=2 ;; *) scale=1 ;; esac
  "$0" screenshot "$1" --scale "$scale" -o "$2" >/dev/null' "$ZENFX"

# The gallery: four thumbnails a row, each linking its picture.
gallery=$(mktemp)
trap 'rm -f "$list" "$gallery"' EXIT
{
  echo "<!-- editors:begin (written by make screenshots) -->"
  echo "| | | | |"
  echo "|:-:|:-:|:-:|:-:|"
  row=""
  count=0
  while IFS="$(printf '\t')" read -r file key name; do
    row="$row| <a href=\"$OUT/$file.png\"><img src=\"$OUT/$file.png\" width=\"200\" alt=\"$name\"></a><br>$name "
    count=$((count + 1))
    if [ $count -eq 4 ]; then echo "$row|"; row=""; count=0; fi
  done <"$list"
  if [ $count -gt 0 ]; then
    while [ $count -lt 4 ]; do row="$row| "; count=$((count + 1)); done
    echo "$row|"
  fi
  printf '\nAt 200 %%:'
  for file in $DOUBLE; do printf ' [%s](%s/2x/%s.png)' "$file" "$OUT" "$file"; done
  echo
  echo "<!-- editors:end -->"
} >"$gallery"

# Replaces the gallery between its markers in README.md.
awk -v gallery="$gallery" '
  /<!-- editors:begin/ { while ((getline line < gallery) > 0) print line; skip = 1; next }
  /<!-- editors:end -->/ { skip = 0; next }
  !skip { print }' README.md >README.md.tmp
mv README.md.tmp README.md
echo "screenshots: $(wc -l <"$list") editors in $OUT, README gallery updated"

#!/bin/bash
# The effect's share of the time of an encoding: "Film Pro" with everything, on a 1080p clip, written as H.264 with
# the encoder's default preset. Prints a Markdown table.
#
#   bench/encode_share.sh [SECONDS]  default: a clip of 8 seconds
#
# The share is the rendering time of the frames, as measured by frames_bench, divided by the elapsed time of the run.
set -euo pipefail
source "$(dirname "$0")/../scripts/common.sh"

seconds=${1:-8}
reelfx=$velmoraRoot/build/native/dist/reelfx
bench=$velmoraRoot/build/native/bench/frames_bench
case="Film Pro, everything"
if [ ! -x "$reelfx" ] || [ ! -x "$bench" ]; then
    die "build reelfx and frames_bench first: cmake --build --preset native"
fi

work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# A moving picture with grain, like film.
ffmpeg -v error -nostdin -f lavfi -i "testsrc2=s=1920x1080:r=30:d=$seconds" -vf noise=alls=6:allf=t,format=yuv420p \
    -c:v libx264 -preset ultrafast -crf 12 "$work/clip.mp4"
frames=$((seconds * 30))

# Elapsed time and processor time in seconds: the fastest of three runs.
TIMEFORMAT='%R %U %S'
for _ in 1 2 3; do
    { time "$reelfx" render -q -y -e "Film Pro" --set "Y Jitter=6" --set "X Jitter=6" --set "Flicker=34" \
        --set "Flicker Rate=27" --set "Saturation=-40" --set "Brightness=-10" --set "Contrast=20" \
        --set "Film Gamma=44" --set "Diffusion=50" --set "Wear=33" --set "Spots=100" --set "Density=100" \
        --set "Depth=60" --set "Black=on" --set "White=on" --set "Thick=on" \
        "$work/clip.mp4" "$work/out.mp4" 2> "$work/errors" || { cat "$work/errors" >&2; die "reelfx failed"; }; } 2>> "$work/times"
done
read -r wall user system < <(sort -n "$work/times" | head -n 1)
ms=$("$bench" --benchmark_filter="^$case \(" 2> /dev/null | awk -F'|' 'END { print $3 }')

awk -v frames="$frames" -v wall="$wall" -v cpu="$user" -v sys="$system" -v ms="$ms" 'BEGIN {
    print "| frames | encoding, s | of processors, s | rendering, s | share (goal 25 %) |\n|---|---|---|---|---|"
    printf "| %d | %.1f | %.1f | %.2f | %.0f %% |\n", frames, wall, cpu + sys, frames * ms / 1000, 100 * frames * ms / 1000 / wall
}' < /dev/null

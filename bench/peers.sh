#!/bin/bash
# Times other programs doing comparable work on frames of the same size, in one run with ours; prints two Markdown
# tables, for the effects alone and for whole runs from file to file.
#
#   bench/peers.sh [--effects | --files] [FRAMES]    one of the tables only; default 120 frames each
#   VELMORA_BENCH=path/frames_bench  default: build/native/bench/frames_bench
#   VELMORA_REELFX=path/reelfx       default: build/native/dist/reelfx
#
# A peer's time is the processor time of a run with its filter minus that of the same run without it. Its source is
# one picture that stays in the caches, which our frames do not. Installs missing peers. Ours are the frames of
# the first level that frames_bench measures, AVX2.
set -euo pipefail
source "$(dirname "$0")/../scripts/common.sh"

part=all
case ${1:-} in --effects | --files) part=${1#--} && shift ;; esac
frames=${1:-120}
bench=${VELMORA_BENCH:-$velmoraRoot/build/native/bench/frames_bench}
reelfx=${VELMORA_REELFX:-$velmoraRoot/build/native/dist/reelfx}
size=1920x1080
packages=(ffmpeg vlc-bin vlc-plugin-base melt frei0r-plugins gstreamer1.0-tools gstreamer1.0-plugins-base gstreamer1.0-plugins-good)

if [ ! -x "$bench" ] || [ ! -x "$reelfx" ]; then
    die "build frames_bench and reelfx first: cmake --build --preset native --target frames_bench reelfx"
fi
dpkg -s "${packages[@]}" > /dev/null 2>&1 ||
    as_root apt-get -q install -y --no-install-recommends "${packages[@]}" > /dev/null

work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# Processor time of a command in seconds: the minimum of three runs.
seconds() {
    local TIMEFORMAT='%U %S' i
    for i in 1 2 3; do
        { time "$@" > "$work/out" 2> "$work/errors"; } 2>> "$work/times" || { cat "$work/errors" >&2; die "failed: $*"; }
    done
    awk '{ t = $1 + $2; if (NR == 1 || t < least) least = t } END { print least }' "$work/times"
    rm "$work/times"
}

run_ffmpeg() {
    seconds ffmpeg -v error -nostdin -threads 1 -filter_threads 1 -filter_complex_threads 1 -f lavfi \
        -i "testsrc2=s=$size:r=30,format=$1,trim=end_frame=1,loop=loop=-1:size=1" -vf "$2" -frames:v "$frames" -f null -
}
run_melt() {
    local filters=() name
    for name in "$@"; do filters+=(-filter "$name"); done
    # A consumer that requests the pictures; MLT's null consumer does not.
    seconds melt -silent -profile atsc_1080p_30 "color:gray" "out=$((frames - 1))" "${filters[@]}" -consumer \
        avformat:/dev/null f=rawvideo vcodec=rawvideo pix_fmt=yuyv422 an=1 real_time=0 terminate_on_pause=1
}
run_gstreamer() {
    seconds gst-launch-1.0 -q videotestsrc "num-buffers=$frames" pattern=white ! \
        "video/x-raw,format=BGRx,width=${size%x*},height=${size#*x}" ! "$@" ! fakesink
}

# VLC refuses to run for root, and applies filters only on the way to a file.
chmod 755 "$work"
mkdir -m 777 "$work/vlc"
clip=$work/clip.mp4
ffmpeg -v error -nostdin -f lavfi -i "testsrc2=s=$size:r=30" -vf noise=alls=6:allf=t,format=yuv420p \
    -frames:v "$frames" -c:v libx264 -preset ultrafast -crf 20 "$clip"
run_vlc() {
    local user=()
    [ "$(id -u)" != 0 ] || user=(setpriv --reuid=65534 --regid=65534 --clear-groups)
    seconds "${user[@]}" env HOME="$work/vlc" vlc -I dummy -q --no-audio "$clip" \
        --sout "#transcode{vcodec=I420,threads=1$1}:std{access=file,mux=avi,dst=$work/vlc/out.avi}" vlc://quit
}

# Prints "case|peer|milliseconds per frame" from a run and the same run without the filter.
peer() {
    awk -v with="$3" -v without="$4" -v frames="$frames" -v case="$1" -v name="$2" \
        'BEGIN { printf "%s|%s|%.3f\n", case, name, 1000 * (with - without) / frames }' < /dev/null >> "$work/peers"
}

declare -A emptyFfmpeg
ffmpeg_peer() {  # case, name, filter, pixel format
    local format=${4:-bgra}
    [ -n "${emptyFfmpeg[$format]:-}" ] || emptyFfmpeg[$format]=$(run_ffmpeg "$format" null)
    peer "$1" "$2" "$(run_ffmpeg "$format" "$3")" "${emptyFfmpeg[$format]}"
}
melt_peer() {  # case, filters
    local case=$1
    shift
    peer "$case" "MLT $*" "$(run_melt "$@")" "$emptyMelt"
}

# The effects alone.
if [ $part != files ]; then

emptyMelt=$(run_melt)
emptyGstreamer=$(run_gstreamer identity)
emptyVlc=$(run_vlc "")

ffmpeg_peer "Film Camera, jitter only" "FFmpeg crop, pad" "crop=1910:1070:x='mod(n,10)':y='mod(n,10)',pad=1920:1080"
tables="Film Look, tables only"
ffmpeg_peer "$tables" "frei0r brightness" "frei0r=brightness:0.6"
ffmpeg_peer "$tables" "frei0r gamma" "frei0r=gamma:0.6"
ffmpeg_peer "$tables" "FFmpeg lutrgb" "lutrgb=r=val*0.9:g=val*0.9:b=val*0.9"
ffmpeg_peer "$tables" "FFmpeg curves" "curves=vintage"
mix="Film Look, with saturation"
ffmpeg_peer "$mix" "frei0r saturat0r" "frei0r=saturat0r:0.3"
ffmpeg_peer "$mix" "frei0r tint0r" "frei0r=tint0r:0x000000|0xFFC080|0.5"
ffmpeg_peer "$mix" "FFmpeg colorchannelmixer" "colorchannelmixer=.393:.769:.189:0:.349:.686:.168:0:.272:.534:.131"
glow="Film Look, with diffusion"
ffmpeg_peer "$glow" "frei0r glow" "frei0r=glow:0.3"
ffmpeg_peer "$glow" "frei0r softglow" "frei0r=softglow:0.3|0.5|0.5|0"
ffmpeg_peer "$glow" "FFmpeg gblur, screen" "split[a][b];[b]gblur=20[c];[a][c]blend=all_mode=screen" gbrp
damage="Film Damage, wear, 25 spots, 16 scratches"
melt_peer "$damage" oldfilm dust lines grain
peer "$damage" "VLC oldmovie" "$(run_vlc ,vfilter=oldmovie)" "$emptyVlc"
peer "$damage" "GStreamer agingtv" "$(run_gstreamer agingtv)" "$emptyGstreamer"
everything="Film Pro, everything but diffusion"
ffmpeg_peer "$everything" "FFmpeg curves, eq, noise, vignette" "curves=vintage,eq=contrast=1.1,noise=alls=20:allf=t,vignette"
melt_peer "$everything" oldfilm dust lines grain tcolor vignette

"$bench" 2> /dev/null > "$work/ours"
awk -F'|' '
    FILENAME ~ /ours$/ { name = $2; sub(/^ /, "", name); sub(/ \(goal.*$/, "", name); sub(/ $/, "", name); ms[name] = $3; next }
    { if (!($1 in best) || $3 < best[$1]) { best[$1] = $3; who[$1] = $2 }; rows[NR] = $0; count = NR }
    END {
        print "| work | peer | peer, ms | ours, ms | ours ÷ peer |\n|---|---|---|---|---|"
        for (i = 1; i <= NR; ++i) if (i in rows) {
            split(rows[i], r, "|")
            mark = who[r[1]] == r[2] ? "**" : ""
            printf "| %s | %s | %.2f | %.2f | %s%.2f%s |\n", r[1], r[2], r[3], ms[r[1]], mark, ms[r[1]] / r[3], mark
        }
        print "\nBold: the best peer of each work."
    }' "$work/ours" "$work/peers"

fi
[ $part != effects ] || exit 0

# From file to file: an H.264 clip in, raw 4:2:0 out, so that no encoder hides the rest. With as many threads as the
# programs take by themselves.
file_ffmpeg() { seconds ffmpeg -v error -nostdin -y -i "$clip" -vf "$1" -c:v rawvideo -pix_fmt yuv420p "$work/out.nut"; }
file_melt() {
    local filters=() name
    for name in "$@"; do filters+=(-filter "$name"); done
    seconds melt -silent "avformat:$clip" "${filters[@]}" -consumer "avformat:$work/out.nut" f=nut vcodec=rawvideo \
        pix_fmt=yuv420p an=1 real_time=0 terminate_on_pause=1
}
file_reelfx() {
    seconds "$reelfx" render -q -y --codec rawvideo --pix-fmt yuv420p "$@" "$clip" "$work/out.nut"
}
{
    echo "nothing|FFmpeg to BGRA and back|$(file_ffmpeg format=bgra,format=yuv420p)"
    echo "Film Camera, \"Train Ride\"|reelfx|$(file_reelfx -e "Film Camera" -p "Train Ride")"
    echo "a tinted look|FFmpeg, frei0r tint0r|$(file_ffmpeg "frei0r=tint0r:0x000000|0xFFC080|0.5")"
    echo "Film Look, \"Sepia\"|reelfx|$(file_reelfx -e "Film Look" -p Sepia)"
    echo "old film|MLT oldfilm dust lines grain|$(file_melt oldfilm dust lines grain)"
    echo "old film|VLC oldmovie|$(run_vlc ,vfilter=oldmovie)"
    echo "Film Damage, \"Aged\"|reelfx|$(file_reelfx -e "Film Damage" -p Aged)"
    echo "everything|FFmpeg, frei0r tint0r, glow, then noise|$(file_ffmpeg "frei0r=tint0r:0x000000|0xFFC080|0.5,frei0r=glow:0.3,noise=alls=20:allf=t")"
    echo "everything|MLT oldfilm dust lines grain tcolor vignette|$(file_melt oldfilm dust lines grain tcolor vignette)"
    echo "Film Pro, \"Super 8\"|reelfx|$(file_reelfx -e "Film Pro" -p "Super 8")"
} > "$work/files"
awk -F'|' -v frames="$frames" '
    BEGIN { print "\n| from file to file | program | s | ms a frame |\n|---|---|---|---|" }
    { printf "| %s | %s | %.2f | %.1f |\n", $1, $2, $3, 1000 * $3 / frames }' "$work/files"

#!/usr/bin/env bash
# Makes the pictures of docs/PICTURES.md from the sample clip by the tools, so that they stay true.
# FFmpeg's command cuts, weaves and lays the tiles side by side; every conversion shown is ours.
# usage: scripts/make-pictures.sh [TOOLS [FOLDER]]   else build/release/tools and docs/pictures
set -euo pipefail
cd "$(dirname "$(readlink -f "$0")")/.."
convert=${1:-build/release/tools}/vidshow-convert
folder=${2:-docs/pictures}
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
mkdir -p "$folder"

run_ffmpeg() { ffmpeg -v error -nostdin -y "$@"; }

# lay_tiles OUT COLUMNS SCALE TILE...: tiles of one size in rows, every pixel SCALE times as large.
lay_tiles() {
    local out=$1 columns=$2 scale=$3 tile number=0 rows
    shift 3
    rows=$((($# + columns - 1) / columns))
    rm -f "$work"/tile-*.png
    for tile in "$@"; do
        cp "$tile" "$(printf '%s/tile-%02d.png' "$work" $number)"
        number=$((number + 1))
    done
    run_ffmpeg -i "$work/tile-%02d.png" -frames:v 1 -compression_level 100 -pred mixed -vf \
        "scale=iw*$scale:ih*$scale:flags=neighbor,tile=${columns}x$rows:padding=4:color=white" "$out"
}

# Top lines of frame 20 and bottom lines of frame 21; then the part where something moves.
deinterlacing() {
    run_ffmpeg -i samples/street.mp4 -vf \
        "select='between(n,20,21)',tinterlace=mode=interleave_top,setpts=PTS-STARTPTS" -frames:v 1 \
        -pix_fmt yuv420p -c:v ffv1 "$work/woven.mkv"
    local mode tiles=()
    for mode in off fast discard bob blend mean linear x; do
        "$convert" "$work/woven.mkv" "$work/whole.png" --to rgb888 --deinterlace $mode
        run_ffmpeg -i "$work/whole.png" -vf "crop=$1" "$work/$mode.png"
        tiles+=("$work/$mode.png")
    done
    lay_tiles "$folder/deinterlacing.png" 4 2 "${tiles[@]}"
}

resizing() {
    run_ffmpeg -i samples/street.mp4 -vf "crop=$1" -frames:v 1 -c:v ffv1 "$work/detail.mkv"
    local name tiles=()
    for name in nearest linear nearlinear; do
        "$convert" "$work/detail.mkv" "$work/$name.png" --to rgb565 --resize 240x180 \
            --algorithm $name
        tiles+=("$work/$name.png")
    done
    lay_tiles "$folder/resizing.png" 3 1 "${tiles[@]}"
}

# Bars that were made with the matrix of BT.709, shown by each matrix.
matrices() {
    run_ffmpeg -f lavfi -i smptehdbars=size=192x108 -frames:v 1 -pix_fmt yuv420p -c:v ffv1 \
        "$work/bars.mkv"
    local name tiles=()
    for name in bt601 bt709 smpte240m fcc; do
        "$convert" "$work/bars.mkv" "$work/$name.png" --to rgb888 --matrix $name
        tiles+=("$work/$name.png")
    done
    lay_tiles "$folder/matrices.png" 4 1 "${tiles[@]}"
}

# The way of a frame: boxes in a column, the second way beside it.
box() { # X Y TEXT NOTE
    printf '<rect x="%d" y="%d" width="250" height="46" rx="6" fill="#eef3f8" stroke="#456"/>\n' "$1" "$2"
    printf '<text x="%d" y="%d" font-weight="bold">%s</text>\n' $(($1 + 125)) $(($2 + 20)) "$3"
    printf '<text x="%d" y="%d" font-size="11">%s</text>\n' $(($1 + 125)) $(($2 + 37)) "$4"
}
arrow() { # X1 Y1 X2 Y2
    printf '<line x1="%d" y1="%d" x2="%d" y2="%d" stroke="#456" marker-end="url(#head)"/>\n' "$@"
}
presenting() {
    {
        cat <<'SVG'
<svg xmlns="http://www.w3.org/2000/svg" width="560" height="490" font-family="sans-serif" font-size="13" text-anchor="middle">
<defs><marker id="head" markerWidth="9" markerHeight="8" refX="8" refY="4" orient="auto"><path d="M0 0L9 4L0 8z" fill="#456"/></marker></defs>
<rect width="560" height="490" fill="white"/>
SVG
        box 155 10 "player" "IJxVideoPresenterStream::Present"
        box 155 90 "presenter/ stream" "top byte of the format code chooses the way"
        arrow 280 56 280 89
        box 10 180 "presenter/android/ renderer" "ANativeWindow_lock, YV12 buffer"
        box 10 260 "imageproc/ pipeline" "deinterlaces, chooses one kernel"
        box 10 340 "kernels/" "planes into the buffer"
        arrow 230 136 150 179
        arrow 135 226 135 259
        arrow 135 306 135 339
        box 300 180 "decoder buffer" "an android::MediaBuffer, unchanged"
        arrow 330 136 410 179
        box 155 430 "native window" "posted, or queued"
        arrow 135 386 240 429
        arrow 425 226 340 429
        echo '</svg>'
    } >"$folder/presenting.svg"
}

deinterlacing "${DEINTERLACED_PART:-80:120:556:292}"
resizing "${RESIZED_PART:-80:60:396:196}"
matrices
presenting

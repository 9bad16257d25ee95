#!/usr/bin/env bash
# velatone render on real files: every format, alpha kept straight, settings round trips,
# sequences, and clear failures. Usage: render_files.sh BUILD_DIR SOURCE_DIR
set -u
build=$1
source=$2
velatone="$build/velatone"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
passed=0
failed=0
check() {  # name, command...
    local name=$1
    shift
    if "$@" > "$work/out.txt" 2>&1; then
        passed=$((passed + 1))
    else
        failed=$((failed + 1))
        echo "FAILED: $name"
        sed 's/^/    /' "$work/out.txt"
    fi
}
fails() {  # name, expected text, command...: the command must fail, say the text and write nothing
    local name=$1 text=$2
    shift 2
    if "$@" > "$work/out.txt" 2>&1; then
        failed=$((failed + 1))
        echo "FAILED: $name (succeeded)"
    elif ! grep -q -- "$text" "$work/out.txt"; then
        failed=$((failed + 1))
        echo "FAILED: $name (said:)"
        sed 's/^/    /' "$work/out.txt"
    else
        passed=$((passed + 1))
    fi
}
same_pixels() { oiiotool --diff "$1" "$2" > /dev/null; }

scene="$source/demo/scene.png"
# A straight-alpha image whose colour must survive where alpha is low.
oiiotool --pattern fill:topleft=0.8,0.3,0.1,0.1:topright=0.1,0.9,0.4,1:bottomleft=0.2,0.2,0.9,0.5:bottomright=1,1,1,0 64x48 4 -d uint8 -o "$work/alpha.png"
oiiotool "$scene" -d uint16 -o "$work/scene16.tif"
oiiotool "$scene" -d half -o "$work/scenehalf.exr"
oiiotool "$scene" -d float -o "$work/scenefloat.exr"
oiiotool "$scene" -ch R,G,B -d uint16 -o "$work/scene.dpx"
oiiotool "$scene" -ch R,G,B -o "$work/scene.jpg"

# A reset record gives back every file as it came (within the 16-bit world's 15 bits).
check "8-bit png identity" bash -c "'$velatone' render '$scene' '$work/id.png' && oiiotool --diff '$scene' '$work/id.png'"
check "straight alpha kept" bash -c "'$velatone' render '$work/alpha.png' '$work/alpha-out.png' && oiiotool --diff '$work/alpha.png' '$work/alpha-out.png'"
check "16-bit tiff identity" bash -c "'$velatone' render '$work/scene16.tif' '$work/id16.tif' && oiiotool --diff --fail 0.00004 '$work/scene16.tif' '$work/id16.tif'"
check "half exr identity" bash -c "'$velatone' render '$work/scenehalf.exr' '$work/idhalf.exr' && oiiotool --diff '$work/scenehalf.exr' '$work/idhalf.exr'"
check "float exr identity" bash -c "'$velatone' render '$work/scenefloat.exr' '$work/idfloat.exr' && oiiotool --diff '$work/scenefloat.exr' '$work/idfloat.exr'"
check "dpx" "$velatone" render "$work/scene.dpx" "$work/out.dpx" --set "HSL/Master/Saturation=150"
check "jpeg" "$velatone" render "$work/scene.jpg" "$work/out.jpg" --set "HSL/Master/Saturation=150"
check "every layout and host" bash -c "
  set -e
  '$velatone' render '$scene' '$work/l1.png' --host premiere --layout bgra
  '$velatone' render '$scene' '$work/l2.png' --host premiere --layout vuya --depth 32
  '$velatone' render '$scene' '$work/l3.png' --host premiere --layout vuya422
  '$velatone' render '$scene' '$work/l4.png' --host avid --depth 16
  '$velatone' render '$scene' '$work/l5.png' --classic
  oiiotool --diff '$scene' '$work/l1.png'"

# A grade, saved and reloaded, reproduces the same bytes, by both routes.
check "settings round trip" bash -c "
  set -e
  '$velatone' render '$scene' '$work/g1.png' --set 'HSL/Master/Saturation=140' --set 'RGB/Shadows/Blue Gain=1.3' \
      --set 'Limiter/Video System=PAL' --save-settings '$work/grade.settings'
  test \$(stat -c %s '$work/grade.settings') = 33556
  '$velatone' render '$scene' '$work/g2.png' --settings '$work/grade.settings'
  cmp '$work/g1.png' '$work/g2.png'
  '$velatone' render '$scene' '$work/g3.png' --settings '$work/grade.settings' --host avid
  cmp '$work/g1.png' '$work/g3.png'
  ! cmp -s '$scene' '$work/g1.png'"

# Sequences: every numbered frame, numbered outputs.
mkdir -p "$work/seq"
for f in 1 2 3; do cp "$scene" "$work/seq/in.000$f.png"; done
check "sequence" bash -c "
  set -e
  '$velatone' render '$work/seq/in.####.png' '$work/seq/out.####.png' --set 'HSL/Master/Hue=30'
  for f in 1 2 3; do cmp '$work/seq/out.0001.png' '$work/seq/out.000'\$f'.png'; done"

# Presets, curve and LUT files, keyframes, and the settings command.
samples="$source/tests/data"
acv=$(ls "$samples"/point_curve/*.acv | head -n 1)
lut=$(ls "$samples"/autodesk_lut/*.lut | grep -v -i error | head -n 1)
check "curves change the image" bash -c "
  set -e
  '$velatone' render '$scene' '$work/c1.png' --curves '$acv'
  ! cmp -s '$work/c1.png' '$work/id.png'
  '$velatone' render '$scene' '$work/c2.png' --curves '$lut'"
check "settings: flat record, text form, round trips" bash -c "
  set -e
  '$velatone' settings --set 'HSL/Midtones/Gamma=1.4' --curves '$acv' --out '$work/s1.settings'
  '$velatone' settings --settings '$work/s1.settings' --print > '$work/s1.txt'
  head -c 14 '$work/s1.txt' | grep -q '^Velatone.8389'
  '$velatone' settings --scan '$work/s1.txt' --out '$work/s2.settings'
  cmp '$work/s1.settings' '$work/s2.settings'
  '$velatone' settings --settings '$work/s1.settings' --diff | grep -q 'tone curves'
  '$velatone' settings --settings '$work/s1.settings' --save-curves '$work/s1.acv'
  '$velatone' settings --curves '$work/s1.acv' --out '$work/s3.settings'"
check "keyframes interpolate between their records" bash -c "
  set -e
  '$velatone' settings --set 'HSL/Master/Saturation=0' --out '$work/k1.settings'
  '$velatone' settings --set 'HSL/Master/Saturation=200' --out '$work/k2.settings'
  '$velatone' render '$work/seq/in.####.png' '$work/seq/key.####.png' --key 1:'$work/k1.settings' --key 3:'$work/k2.settings'
  '$velatone' render '$scene' '$work/k-first.png' --settings '$work/k1.settings'
  '$velatone' render '$scene' '$work/k-last.png' --settings '$work/k2.settings'
  '$velatone' render '$scene' '$work/k-mid.png' --set 'HSL/Master/Saturation=100' --set 'HSL/Master/Hue=0'
  cmp '$work/seq/key.0001.png' '$work/k-first.png'
  cmp '$work/seq/key.0003.png' '$work/k-last.png'
  ! cmp -s '$work/seq/key.0002.png' '$work/k-first.png'
  ! cmp -s '$work/seq/key.0002.png' '$work/k-last.png'"
fails "truncated LUT" "result: -39" "$velatone" render "$scene" "$work/x.png" --curves "$source/tests/data/autodesk_lut/error_truncated_file.lut"
fails "not a preset" "result: -2041" bash -c "echo 'hello' > '$work/bad.vtpreset'; '$velatone' render '$scene' '$work/x.png' --preset '$work/bad.vtpreset'"
fails "one key" "twice" "$velatone" render "$scene" "$work/x.png" --key "1:$work/k1.settings"

fails "unknown parameter" "no parameter \"HSL/Master/Nope\"" "$velatone" render "$scene" "$work/x.png" --set "HSL/Master/Nope=1"
fails "out of range" "takes 0 to 300" "$velatone" render "$scene" "$work/x.png" --set "HSL/Master/Saturation=400"
fails "bad popup" "is not a choice" "$velatone" render "$scene" "$work/x.png" --set "Limiter/Video System=SECAM"
fails "short settings file" "holds 10 bytes" bash -c "head -c 10 /dev/zero > '$work/short.settings'; '$velatone' render '$scene' '$work/x.png' --settings '$work/short.settings'"
fails "missing input" "cannot read" "$velatone" render "$work/none.png" "$work/x.png"
fails "layout the host lacks" "cannot hand over" "$velatone" render "$scene" "$work/x.png" --layout bgra
check "nothing written on failure" test ! -e "$work/x.png"

echo "cli: $passed passed, $failed failed"
[ "$failed" -eq 0 ]

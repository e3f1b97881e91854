#!/usr/bin/env bash
# Generates the default example waveform with the command-line tool, draws its spectrum and its
# resource grid, and says where everything is.
set -euo pipefail
cli=$1
wave=$2
out=build/demo
mkdir -p "$out"
"$cli" validate "$wave"
"$cli" generate "$wave" -o "$out/wave.bin"
"$cli" plot "$out/wave.bin" --doc "$wave" --kind spectrum -o "$out/spectrum.png"
pictures="$out/spectrum.png (spectrum)"
# A waveform of continuous-wave carriers has no resource grid: then only the spectrum is drawn.
if "$cli" plot "$out/wave.bin" --doc "$wave" --kind grid -o "$out/grid.png"; then
    pictures="$pictures and $out/grid.png (resource grid of carrier 0, frame 0)"
fi
echo "demo: sample file (complex double, little endian) and marker file (.mkr) are in $out/"
echo "demo: pictures: $pictures"

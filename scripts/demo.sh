#!/usr/bin/env bash
# Generates the default example waveform with the command-line tool and says where it is.
set -euo pipefail
cli=$1
wave=$2
out=build/demo
mkdir -p "$out"
"$cli" validate "$wave"
"$cli" generate "$wave" -o "$out/wave.bin"
echo "demo: sample file (complex double, little endian) and marker file (.mkr) are in $out/"

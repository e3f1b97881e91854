#!/usr/bin/env bash
# Runs the command-line tool on the default example waveform and prints a short summary.
set -euo pipefail
cli=$1
wave=$2
out=build/demo
mkdir -p "$out"
"$cli" validate "$wave"
"$cli" show "$wave" > "$out/effective.json"
echo "demo: the effective settings of $wave (every setting, defaults filled in) are in $out/effective.json"
echo "demo: $(grep -c '"' "$out/effective.json") settings lines; carriers: $(python3 -c "import json,sys; d=json.load(open('$out/effective.json')); print(len(d['NRCarriers']))")"

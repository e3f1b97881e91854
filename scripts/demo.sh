#!/usr/bin/env bash
# Runs the command-line tool on the default example waveform.
set -euo pipefail
cli=$1
wave=$2
"$cli" --version
"$cli" --help

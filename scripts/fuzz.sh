#!/usr/bin/env bash
# Runs each libFuzzer target of the sanitizer build for SECONDS, seeded with the examples and
# the dictionary of setting names. New corpus entries stay in build/asan/fuzz/corpus/<target>;
# a crash leaves its input in build/asan/fuzz/findings/ and fails the run.
# usage: scripts/fuzz.sh SECONDS [TARGET...]
set -euo pipefail
cd "$(dirname "$0")/.."
seconds=${1:?usage: scripts/fuzz.sh SECONDS [TARGET...]}
shift
targets=("$@")
[ ${#targets[@]} -eq 0 ] && targets=(document valid_document)

dir=build/asan/fuzz
mkdir -p "$dir/findings"
status=0
for target in "${targets[@]}"; do
  binary="$dir/nrsynth_fuzz_$target"
  [ -x "$binary" ] || { echo "fuzz: $binary is missing; run make test-asan first" >&2; exit 1; }
  corpus="$dir/corpus/$target"
  mkdir -p "$corpus"
  # Any-document fuzzing starts from the examples and the dictionary; the valid-document
  # generator reads a fixed-size choice string, so it starts at full length.
  if [ "$target" = document ]; then
    options=(-dict="$dir/nrsynth.dict" -max_len=65536)
    seeds=(examples)
  else
    options=(-len_control=0 -max_len=256)
    seeds=()
  fi
  echo "fuzz: $target for ${seconds}s"
  # The driver keeps each run short; a minute without an answer means a hang.
  if ! ASAN_OPTIONS=detect_leaks=1:abort_on_error=1 UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1 \
      "$binary" -max_total_time="$seconds" -timeout=60 -report_slow_units=1000 -rss_limit_mb=3072 \
      "${options[@]}" -artifact_prefix="$dir/findings/$target-" -print_final_stats=1 \
      "$corpus" "${seeds[@]}" >"$dir/$target.log" 2>&1; then
    echo "fuzz: $target found a failure; see $dir/$target.log and $dir/findings/" >&2
    tail -40 "$dir/$target.log" >&2
    status=1
  fi
  grep -E '^stat::number_of_executed_units|^stat::peak_rss_mb' "$dir/$target.log" | tr '\n' ' '
  echo
done
exit $status

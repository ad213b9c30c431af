#!/usr/bin/env bash
# Times the same workloads on the x86-64 build (build/) and on the 32-bit
# Windows build under wine (build-win/), in alternation, and prints the
# medians side by side with the ratio 32-bit / x86-64.
#   BENCH_ROUNDS     processes per build, alternating (default 3)
#   BENCH_VARIANTS   variants of the 32-bit build to time (default 4; the
#                    x86-64 build is timed on variant 4)
#   BENCH_WIN_ARGS   more arguments for both, e.g. "--filter FFT --reps 9"
set -eu
cd "$(dirname "$0")/.."
rounds=${BENCH_ROUNDS:-3}
variants=${BENCH_VARIANTS:-4}
extra=(${BENCH_WIN_ARGS:-})
out=$(mktemp -d)
trap 'rm -rf "$out"' EXIT
for _ in $(seq "$rounds"); do
  ./build/zor_variant_bench --variants 4 "${extra[@]}" >> "$out/x86-64.tsv"
  scripts/wine-run.sh build-win/bin/zor_variant_bench.exe --variants "$variants" "${extra[@]}" \
    >> "$out/win32.tsv"
done
./build/zor_variant_bench --table "$out/x86-64.tsv" "$out/win32.tsv"

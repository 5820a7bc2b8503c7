#!/bin/bash
# SPDX-License-Identifier: MIT OR GPL-2.0-only
# Builds every fuzz target into $OUT with the compiler, flags and engine of the environment. $WORK is for what lies
# between; the machine has the packages of the groups scripts, build, libraries, host and test.
set -eu

root=$(cd -- "$(dirname -- "$0")/.." && pwd -P)
made=${WORK:?}/pmx

cmake -S "$root" -B "$made" -G Ninja -DPMX_SANITIZE=FUZZ -DPMX_TESTS=OFF -DPMX_FUZZ_FLAGS="${CXXFLAGS:?}" \
    -DPMX_FUZZ_ENGINE="${LIB_FUZZING_ENGINE:?}"
cmake --build "$made" --target fuzzers

for fuzzer in "$made"/*_fuzz
do
    name=$(basename -- "$fuzzer" _fuzz)
    cp -- "$fuzzer" "${OUT:?}/"
    cp -- "$made/fuzz/inputs/$name.dict" "$OUT/${name}_fuzz.dict"
    mkdir -p -- "$made/corpus/$name"
    for seeds in "$made/fuzz/inputs/$name" "$root/fuzz/findings/$name"
    do
        [ ! -d "$seeds" ] || cp -R -- "$seeds/." "$made/corpus/$name/"
    done
    (cd -- "$made/corpus/$name" && cmake -E tar cf "$OUT/${name}_fuzz_seed_corpus.zip" --format=zip .)
done
mkdir -p -- "$OUT/pmx"
cp -R -- "$root/boards" "$root/scenarios" "$OUT/pmx/"

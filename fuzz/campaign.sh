#!/bin/bash
# SPDX-License-Identifier: MIT OR GPL-2.0-only
# Runs fuzz targets one after another, so many inputs each, and tells how many it were: NAME N. A corpus grows in
# build/fuzz/corpus/NAME; what breaks down is left in build/fuzz/found/NAME-*.
# usage: campaign.sh NAME=INPUTS...    e.g. campaign.sh operations=10000000 scenario=1000000
set -eu

root=$(cd -- "$(dirname -- "$0")/.." && pwd -P)
made=$root/build/fuzz

# The longest input: as long as seeds are where a part of one says nothing, else as short as shows all that there is.
longest()
{
    case "$1" in
    flash) echo 16 ;;
    operations) echo 256 ;;
    shell) echo 256 ;;
    scenario) echo 1024 ;;
    board) echo 8192 ;;
    recording) echo 26624 ;;
    against) echo 2048 ;;
    decode) echo 4096 ;;
    *) echo 65536 ;;
    esac
}

# What an input has freed is kept as long as it takes, in what the processor has near: a third faster than more of it.
# Who has found something asks again with all that there is to be known: build/fuzz/NAME_fuzz FILE.
quick=malloc_context_size=2:quarantine_size_mb=1:thread_local_quarantine_size_kb=64
export ASAN_OPTIONS=$quick${ASAN_OPTIONS:+:$ASAN_OPTIONS}

mkdir -p -- "$made/found"
answer=0
for wanted
do
    name=${wanted%%=*}
    mkdir -p -- "$made/corpus/$name"
    inputs=("$made/corpus/$name" "$made/fuzz/inputs/$name")
    [ ! -d "$root/fuzz/findings/$name" ] || inputs+=("$root/fuzz/findings/$name")
    log=$made/found/$name.log
    "$made/${name}_fuzz" -runs="${wanted#*=}" -max_len="$(longest "$name")" -timeout=20 -rss_limit_mb=2048 -entropic=0 \
        -print_final_stats=1 -dict="$made/fuzz/inputs/$name.dict" -artifact_prefix="$made/found/$name-" \
        "${inputs[@]}" 2>"$log" || answer=1
    sed -n "s/^stat::number_of_executed_units: */$name /p" "$log"
done
exit "$answer"

#!/bin/sh
# SPDX-License-Identifier: MIT OR GPL-2.0-only
# The first and only program of the kernel under test. What it finds goes to the console, where run.py reads it.
mount -t proc proc /proc
mount -t sysfs sys /sys
mount -t devtmpfs dev /dev 2>/dev/null
mount -t debugfs debug /sys/kernel/debug
dmesg -n 1
files=/sys/kernel/debug/pmx
complaints='BUG|WARNING:|Oops|scheduling while atomic|sleeping function|INFO: |UBSAN|ODEBUG|kmemleak: [0-9]+ new'

load()
{
    insmod /pmx.ko "$@" || echo "WRONG insmod pmx.ko $*"
}

# What the flight recorder has, where there is one.
recording()
{
    [ -f "$files/recording" ] || return
    echo "RECORDING $1"
    gzip -c <"$files/recording" | base64
    echo "RECORDED"
}

unload()
{
    rmmod pmx || echo "WRONG rmmod pmx"
}

# A scenario that powers on again gets a module that was never used.
scenario()
{
    loaded=false
    echo "SCENARIO $1"
    while read -r line
    do
        if [ "$line" = POWER-ON ] && $loaded
        then
            cat "$files/trace"
            recording "$1"
            unload
            loaded=false
        fi
        # shellcheck disable=SC2046 # words
        $loaded || load start=0 $(cat /parameters)
        loaded=true
        [ "$line" = POWER-ON ] || echo "$line" >"$files/command" || echo "WRONG $line"
    done <"/scenarios/$1"
    cat "$files/trace"
    recording "$1"
    unload
    echo "END"
}

# What the kernel's own watchers have found; it is told once.
complain()
{
    dmesg | grep -E "$complaints" | sed 's/^/COMPLAINT /'
    dmesg -c >/dev/null
}

echo "BEGIN $(uname -r)"
echo "PROCESSORS $(grep -c ^processor /proc/cpuinfo)"
for file in /modules/*
do
    [ ! -f "$file" ] || insmod "$file" || echo "WRONG insmod $file"
done
for file in /scenarios/*
do
    [ ! -f "$file" ] || scenario "${file##*/}"
done
if [ -f /more.sh ]
then
    # shellcheck source=tests/kernel/real_time.sh
    . /more.sh
fi
complain
echo "DONE $(cut -d' ' -f1 /proc/uptime)"
# The emulator ends there; not every kernel of our own can switch a machine off.
reboot -f

# SPDX-License-Identifier: MIT OR GPL-2.0-only
# What is measured in virtual time, each of it twice; init.sh reads it.
# shellcheck shell=sh
# measured MODULE [PARAMETER...]
measured()
{
    name=$1
    shift
    insmod "/$name.ko" "$@" || echo "WRONG insmod $name.ko"
    dmesg | sed -n 's/.* COST /COST /p'
    rmmod "$name"
    dmesg -c >/dev/null
}

for round in 1 2
do
    echo "ROUND $round"
    measured pmx_empty
    measured pmx_printed rounds=20
    measured pmx_aside rounds=20 loglevel=0
    /set_crtc || echo "WRONG set_crtc"
done

# SPDX-License-Identifier: MIT OR GPL-2.0-only
# What is looked at in real time, with the object that ships, behind the scenarios; init.sh reads it. Each check says
# RIGHT or WRONG and what it looked at.
# shellcheck shell=sh disable=SC2154 # files is init.sh's

change='PMX_SetModeEx 0 0 0 0 0 0 0 0 1 13 0 0 0 0 0 1 3 0 0 0 0 0 1 1 0 0 0 0 0 50 0 0'
rounds=20

check()
{
    if eval "$2"
    then
        echo "RIGHT $1"
    else
        echo "WRONG $1: $2"
    fi
}

command()
{
    echo "$1" >"$files/command" || echo "WRONG command $1"
}

free_memory()
{
    sync
    echo 3 >/proc/sys/vm/drop_caches
    sed -n 's/^MemFree: *\([0-9]*\).*/\1/p' /proc/meminfo
}

# The first load leaves what the kernel keeps for itself.
loads()
{
    load
    unload
    before=$(free_memory)
    round=0
    while [ "$round" -lt "$rounds" ]
    do
        load
        insmod /pmx_user.ko || echo "WRONG insmod pmx_user.ko"
        rmmod pmx 2>/dev/null && echo "WRONG pmx.ko goes while pmx_user.ko imports from it"
        command "$change"
        rmmod pmx_user
        unload
        round=$((round + 1))
    done
    after=$(free_memory)
    users=$(dmesg | grep -c 'pmx_user: mode')
    check "$rounds loads, with a module that imports the exports" "[ $users -eq $rounds ]"
    check "they lose less than 512 KB" "[ $((before - after)) -lt 512 ]"
}

printed()
{
    dmesg | grep -c ' pmx: '
}

# What a work item prints in the end, and what a level keeps from it; a broken invariant is told besides.
consoles()
{
    for level in 1 9
    do
        before=$(printed)
        load "loglevel=$level"
        command "$change"
        command 'source osd 1 connect'
        command 'fault x_sema_lock -5 0 1'
        command 'i4Pmx_Connect 66 0 65 99'
        command 'PMX_Uninit'
        expected=$(grep -c -E "^\| (PMX_IsLog [0-$level]|Printf|UTIL_Printf|Assert\()" "$files/trace")
        unload
        shown=$(($(printed) - before))
        check "at level $level all is printed" "[ $shown -eq $expected ] && [ $expected -ge $((level + 9)) ]"
    done
}

clocks()
{
    grep -c "PMX_HalClockSet($1)" "$files/trace"
}

sleeps()
{
    load
    command 'PMX_SetEnable 0 1'
    echo devices >/sys/power/pm_test
    echo 1 >/sys/module/suspend/parameters/pm_test_delay
    echo freeze >/sys/power/state || echo "WRONG suspend by pm_test"
    check "suspend by pm_test stops the clocks" "[ $(clocks '0, 0') -eq 1 ] && [ $(clocks '2, 0') -eq 1 ]"
    check "resume by pm_test starts them" "[ $(clocks '0, 1') -eq 1 ] && [ $(clocks '2, 1') -eq 1 ]"
    echo none >/sys/power/pm_test
    echo +2 >/sys/class/rtc/rtc0/wakealarm
    echo freeze >/sys/power/state || echo "WRONG s2idle"
    check "s2idle stops the clocks, an alarm starts them" "[ $(clocks '0, 0') -eq 2 ] && [ $(clocks '2, 1') -eq 2 ]"
    unload
}

# The display part never answers, and the module goes while the timer runs; then once more when a reset has made the
# layer forget it, and when it was stopped.
unloads()
{
    for last in PMX_QueryStatus 'PMX_Reset 0' PMX_Stop
    do
        load
        command 'display-part -1'
        command "$change"
        check "graphics are held back before $last" "grep -q 'x_timer_start(2, 10000' $files/trace"
        command "$last"
        unload
    done
    lost=$(dmesg | grep -c 'timer 2 was still running')
    check "timers that the layer has lost are deleted" "[ $lost -eq 2 ]"
}

# Behind the others, so that a timer of theirs would have struck, too.
display_timer()
{
    load
    command 'display-part -1'
    command "$change"
    begun=$(cut -d. -f1 /proc/uptime)
    while ! grep -q 'PMX timeout' "$files/trace" && [ $(($(cut -d. -f1 /proc/uptime) - begun)) -lt 15 ]
    do
        command 'sleep 200'
    done
    ended=$(cut -d. -f1 /proc/uptime)
    check "the display timer runs out after ten seconds" "[ $((ended - begun)) -ge 9 ] && [ $((ended - begun)) -le 12 ]"
    check "it runs out in a soft interrupt" "grep -q 'EXPIRY timer 2$' $files/trace"
    unload
}

loads
consoles
sleeps
unloads
display_timer

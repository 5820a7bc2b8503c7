# SPDX-License-Identifier: MIT OR GPL-2.0-only
# What is looked at in a kernel that watches, behind the scenarios; init.sh reads it. The kernel's command line names
# the part. Each check says RIGHT or WRONG and what it looked at.
# shellcheck shell=sh disable=SC2154 # init.sh has load, unload, complain
parameters=/sys/module/pmx/parameters
leaks=/sys/kernel/debug/kmemleak
part=$(sed -n 's/.*part=\([a-z]*\).*/\1/p' /proc/cmdline)
minutes=$(sed -n 's/.*minutes=\([0-9]*\).*/\1/p' /proc/cmdline)

check()
{
    if eval "$2"
    then
        echo "RIGHT $1"
    else
        echo "WRONG $1: $2"
    fi
}

# Twice: what is young is not looked at, and what a register held by chance is found when it is gone.
look_for_leaks()
{
    sleep 6
    echo scan >"$leaks"
    sleep 6
    echo scan >"$leaks"
}

# plant FAULT WHAT-IS-SEEN
plant()
{
    complain
    echo "$1" >"$parameters/plant" || echo "WRONG plant $1"
    [ "$1" != leak ] || look_for_leaks
    dmesg | sed 's/^/SEEN /'
    check "the planted fault $1 is seen" "dmesg | grep -qE '$2'"
    dmesg -c >/dev/null
}

# The watcher of locks ends its work at the first thing that it finds, so it is the first that is tried.
planted()
{
    load loglevel=-1
    plant lock-order 'WARNING: possible circular locking dependency detected'
    plant sleep 'BUG: sleeping function called from invalid context'
    plant object 'ODEBUG: free active .* object type: hrtimer'
    plant shift 'UBSAN: shift-out-of-bounds in .*planted.c'
    plant leak 'kmemleak: [0-9]+ new suspected memory leaks'
    check "the planted leak is found in its place" "grep -q plant_leak $leaks"
    plant use-after-free 'BUG: KASAN: use-after-free in .*PMX_SetModeEx'
    unload
}

up()
{
    cut -d. -f1 /proc/uptime
}

# threads LEAST-CALLS LEAST-EXPIRIES: again and again, as long as the command line asks for. The module counts on.
threads()
{
    load loglevel=-1
    end=$(($(up) + 60 * ${minutes:-0}))
    while
        echo "$1" >"$parameters/threads" || echo "WRONG threads"
        [ "$(up)" -lt "$end" ]
    do
        complain
        echo "# $(cat "$parameters/threads")"
    done
    read -r calls _ expiries _ misplaced _ <"$parameters/threads"
    echo "# $calls calls, $expiries expiries"
    check "three threads make $((3 * $1)) calls and more" "[ $calls -ge $((3 * $1)) ]"
    check "the display timer runs out $2 times and more" "[ $expiries -ge $2 ]"
    check "always in soft interrupts" "[ $misplaced -eq 0 ]"
    unload
}

# The watcher's reports, without what the layer prints in between.
reports()
{
    dmesg | sed -e '/\] pmx: /d' -e "s/^\[[^]]*\] /$1 /"
    dmesg -c >/dev/null
}

# Whoever watches is awake at the end, too, and has nothing to say.
awake()
{
    check "locks are watched to the end" "grep -q 'debug_locks: *1' /proc/lockdep_stats"
    look_for_leaks
    check "nothing leaks" "[ ! -s $leaks ]"
    head -n 20 "$leaks"
}

case "$part" in
scenarios) awake ;;
threads)
    threads 4000 100
    awake
    ;;
planted) planted ;;
races)
    echo 20 >/sys/module/kcsan/parameters/skip_watch
    threads 4000 100
    reports RACES
    load loglevel=-1
    echo race >"$parameters/plant"
    unload
    reports PLANTED
    ;;
*) echo "WRONG part $part" ;;
esac

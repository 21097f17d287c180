#!/usr/bin/env bash
# A simulated appliance loses a disk and gets another, and a volume group comes and goes; on another,
# a unit of its cascade runs hot and loses a disk; a third one overheats, loses a fan, its power and a
# link while it is watched; a fourth one burns discs. All with zavctl. Ends with status 0 if every step came out as announced.
# usage: sim/demo.sh BUILD-DIRECTORY
set -euo pipefail

scale=20 # appliance seconds in a second

if [ $# -eq 1 ]; then
    build=$(cd "$1" && pwd)
    # play SCENE ZAVSIM-OPTION...
    play() {
        "$build/zavsim" --time-scale $scale "${@:2}" -- \
            bash "$(realpath "${BASH_SOURCE[0]}")" "$build" "$1"
    }
    play disks --model 2860-4
    play units --model 2980 --units 5
    play health --model 2860-4
    play discs --model 2740-2
    exit
fi
PATH=$1:$PATH

if [ -t 1 ]; then bold=$'\e[1m' plain=$'\e[0m'; else bold='' plain=''; fi

tell() { printf '\n%s# %s%s\n' "$bold" "$*" "$plain"; }

# Seconds of the reader's clock.
pause() { sleep $(($1 * scale)); }

fail() {
    printf 'demo: %s\n' "$*" >&2
    exit 1
}

# show EXIT-STATUS COMMAND...: what a user would type and see. The demo ends with an error if the
# exit status is another one.
show() {
    local expected=$1 status=0
    shift
    printf '\n%s$ %s%s\n' "$bold" "$*" "$plain"
    "$@" 2>&1 || status=$?
    [ "$status" -eq "$expected" ] || fail "exit status $status where $expected was expected"
    pause 2
}

disks_scene() {
    tell "A storage appliance: four disks, three arrays, two volume groups. All is well: exit status 0."
    show 0 zavctl status

    tell "Disk 3 begins to die, and the kernel takes it out of its arrays: exit status 2."
    zavsim act disk 3 fails
    show 2 zavctl disk show 3
    show 1 zavctl array list

    tell "What would its removal do? Another disk would be a mistake, and is refused."
    show 0 zavctl disk remove 3 --dry-run
    show 2 zavctl disk remove 2 --dry-run

    tell "It is taken out of service. What is seen meanwhile is told."
    show 0 zavctl disk remove 3 --yes

    tell "It is pulled out, and an empty disk is put in."
    zavsim act disk 3 vanishes
    zavsim act disk 3 appears
    show 0 zavctl disk add 3 --yes

    tell "The arrays are rebuilt one after the other, while the volumes stay in use."
    rounds=0
    until zavctl array list >/dev/null; do
        printf '\n%s$ zavctl array list%s\n' "$bold" "$plain"
        zavctl array list || true
        rounds=$((rounds + 1))
        [ "$rounds" -le 20 ] || fail 'the rebuild does not end'
        pause 4
    done
    show 0 zavctl array list

    tell "Array 3 is free: a volume group is made on it, and dismantled again."
    show 0 zavctl vg add array 3 --group 2 --yes
    show 0 zavctl vg list
    show 0 zavctl vg remove 2 --yes

    tell "It extends the group of the data array instead."
    show 0 zavctl vg add array 3 --group 1 --yes
    show 0 zavctl pv list

    tell "A group that is dismantled takes its volumes with it, so every one is named before."
    show 0 zavctl vg remove 1 --dry-run
    show 0 zavctl vg remove 1 --yes

    tell "The data group is missing now, and that is a warning: exit status 1."
    show 1 zavctl status
}

units_scene() {
    tell "Another appliance: a RAID controller with five expansion units behind it."
    show 0 zavctl unit list

    tell "Unit 3 runs hot, and unit 2 loses a disk."
    zavsim act unit 3 temperature 88
    zavsim act unit 2 disk 4 vanishes
    show 2 zavctl unit list
    show 2 zavctl disk show 2-4
    show 1 zavctl array show 2-1

    tell "The unit is cooled, a new disk is put in; its controller rebuilds by itself."
    zavsim act unit 3 temperature 45
    zavsim act unit 2 disk 4 appears
    show 1 zavctl array show 2-1
}

# Waits until the watch has told it, for half a minute of the reader's clock at most.
told() {
    local left=300
    until grep -q -- "$1" "$watch_log"; do
        left=$((left - 1))
        [ $left -gt 0 ] || fail "the watch does not tell: $1"
        sleep $((scale / 10))
    done
}

health_scene() {
    watch_log=$(mktemp)
    tell "A third appliance is watched. Changes are pushed to the driver, where another program waits for them."
    printf '\n%s$ zavctl watch --interval 2 --push & zavctl event follow &%s\n' "$bold" "$plain"
    zavctl watch --interval 2 --push > >(tee "$watch_log" | sed -u 's/^/watch:  /') &
    local watch=$!
    zavctl event follow > >(sed -u 's/^/event:  /') &
    local follow=$!
    told OK

    tell "The main board overheats."
    zavsim act temperature 1 is 78
    told 'thermal 1.*critical'

    tell "A fan slows down, and stops."
    zavsim act fan 2 stops
    told 'fan 2.*critical'

    tell "The power fails, and a link is lost."
    zavsim act power fails
    zavsim act port 1 loses its link
    told 'UPS.*on battery'
    told 'eth0.*down'
    show 2 zavctl check

    tell "All is mended. A monitor that reads metrics sees it, too."
    zavsim act temperature 1 is 42
    zavsim act fan 2 recovers
    zavsim act power returns
    zavsim act port 1 gets its link
    told 'UPS.*-> online'
    told 'eth0.*-> up'
    kill "$watch" "$follow"
    wait "$watch" "$follow" || fail "the watch does not end well"
    show 0 zavctl check
    show 0 sh -c "zavctl metrics | grep -E '^zav_(temperature|fan|ups)'"
}

# Percent that the running burn has done.
burned() {
    local percent
    percent=$(zavctl disc progress --json | sed -n 's/.*"percent": \([0-9][0-9]*\).*/\1/p')
    printf '%s' "${percent:-0}"
}

discs_scene() {
    tell "A fourth appliance archives a directory to DVD+R; the disc stays open for more."
    mkdir -p /tmp/archive/2026
    head -c 30000000 /dev/zero >/tmp/archive/2026/january.tar
    head -c 9000000 /dev/zero >/tmp/archive/2026/february.tar
    zavsim act drive gets blank DVD+R
    zavsim act drive writes at 1500
    show 0 zavctl disc info
    show 0 zavctl disc burn /tmp/archive --session open --yes

    tell "A file is added, in a session of its own."
    head -c 5000000 /dev/zero >/tmp/march.tar
    show 0 zavctl disc burn /tmp/march.tar --to 2026-1 --yes

    tell "A CD-R is burned and closed. Another burn is refused before anything is written."
    zavsim act drive loses its disc
    zavsim act drive gets blank CD-R
    show 0 zavctl disc burn /tmp/archive --session close --yes
    show 2 zavctl disc burn /tmp/archive --yes

    tell "A CD-RW is full, and erased."
    zavsim act drive loses its disc
    zavsim act drive gets complete CD-RW with 600 MB used
    show 0 zavctl disc blank --yes

    tell "A burn is stopped half way: the disc's state is told, and what helps."
    zavsim act drive writes at 500
    zavctl disc burn /tmp/archive --yes > >(sed -u 's/^/burn:  /') 2>&1 &
    local burn=$! left=300 status=0
    until [ "$(burned)" -ge 40 ]; do
        left=$((left - 1))
        [ $left -gt 0 ] || fail "the burn makes no progress"
        sleep $((scale / 10))
    done
    show 0 zavctl disc cancel --wait
    wait "$burn" || status=$?
    [ $status -eq 2 ] || fail "exit status $status of a burn that was stopped"
    pause 1
    show 0 zavctl disc blank --yes
}

"$2_scene"

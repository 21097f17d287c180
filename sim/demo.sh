#!/usr/bin/env bash
# A simulated appliance loses a disk and gets it back, seen through zavctl.
# usage: sim/demo.sh BUILD-DIRECTORY
set -euo pipefail

scale=15 # appliance seconds in a second

if [ $# -eq 1 ]; then
    build=$(cd "$1" && pwd)
    exec "$build/zavsim" --model 2860-4 --time-scale $scale -- \
        bash "$(realpath "${BASH_SOURCE[0]}")" "$build" inside
fi
PATH=$1:$PATH

if [ -t 1 ]; then bold=$'\e[1m' plain=$'\e[0m'; else bold='' plain=''; fi

tell() { printf '\n%s# %s%s\n' "$bold" "$*" "$plain"; }

# Seconds of the reader's clock.
pause() { sleep $(($1 * scale)); }

# show EXIT-STATUS COMMAND...: what a user would type and see. The demo ends with an error if the
# exit status is another one.
show() {
    local expected=$1 status=0
    shift
    printf '\n%s$ %s%s\n' "$bold" "$*" "$plain"
    "$@" || status=$?
    if [ "$status" -ne "$expected" ]; then
        printf 'demo: exit status %d where %d was expected\n' "$status" "$expected" >&2
        exit 1
    fi
    pause 2
}

tell "A storage appliance with four disks. All is well: exit status 0."
show 0 zavctl model
show 0 zavctl status

tell "Disk 3 begins to die, and the kernel takes it out of its arrays: exit status 2."
zavsim act disk 3 fails
show 2 zavctl status
show 0 grep -A 1 '^md1' /proc/mdstat

tell "It is pulled out. A slot counts as empty after a grace of 20 seconds (of the appliance)."
zavsim act disk 3 vanishes
show 2 zavctl disk show 3

tell "A new disk comes in. It is found healthy, but the arrays still lack a member: exit status 1."
zavsim act disk 3 appears
show 0 zavctl disk show 3
show 1 zavctl array list

tell "It joins the arrays, which are rebuilt one after the other."
zavsim act disk 3 joins
rounds=0
until zavctl array show 3 >/dev/null; do
    printf '\n%s$ zavctl array list%s\n' "$bold" "$plain"
    zavctl array list || true
    rounds=$((rounds + 1))
    if [ "$rounds" -gt 20 ]; then
        echo 'demo: the rebuild does not end' >&2
        exit 1
    fi
    pause 3
done

tell "All is well again."
show 0 zavctl status

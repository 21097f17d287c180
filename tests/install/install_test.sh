#!/usr/bin/env bash
# What a management program's developer gets: the installed tree, built against by pkg-config and
# by CMake, from where it was installed and from elsewhere.
# usage: install_test.sh SOURCE-DIRECTORY BUILD-DIRECTORY CONFIGURATION
set -u
source=$1 build=$2 configuration=$3
# Below the current directory, which the simulator shows to the program it runs.
scratch=$(mktemp -d "$PWD/install-test-XXXXXX")
trap 'rm -rf "$scratch"' EXIT
. "$source/tests/check.sh"

version=$(sed -n 's/^project(zav VERSION \([0-9.]*\).*/\1/p' "$source/CMakeLists.txt")
warnings=(-Wall -Wextra -Werror)

expected_files() {
    cat <<LIST
bin/zavctl
include/zav/zav.h
include/zav/zav_api.h
include/zav/zav_event.h
include/zav/zav_hwraid.h
include/zav/zav_led.h
include/zav/zav_rbod.h
lib/cmake/zav/zavConfig.cmake
lib/cmake/zav/zavConfigVersion.cmake
lib/cmake/zav/zavTargets-$configuration.cmake
lib/cmake/zav/zavTargets.cmake
lib/libzav.so -> libzav.so.1
lib/libzav.so.1 -> libzav.so.$version
lib/libzav.so.$version
lib/pkgconfig/zav.pc
LIST
}

# files_are_expected DIRECTORY
files_are_expected() {
    (cd "$1" && find . -type l -printf '%P -> %l\n' -o ! -type d -printf '%P\n') | LC_ALL=C sort |
        diff <(expected_files) -
}

install_to() { cmake --install "$build" --prefix "$1"; }
install_staged() { DESTDIR=$scratch/stage cmake --install "$build" --prefix /opt/appliance; }

# The files that people read and link tell nothing of where they were built or installed.
names_no_directory() {
    ! grep -rlF -e "$scratch" -e "$build" -e "$source" "$1/include" "$1/lib/cmake" "$1/lib/pkgconfig"
}

# pc TREE OPTION...
pc() { PKG_CONFIG_PATH='' PKG_CONFIG_LIBDIR="$1/lib/pkgconfig" pkg-config "${@:2}" zav; }

# built_by_pkg_config TREE OUTPUT-DIRECTORY
built_by_pkg_config() {
    local flags run_path
    flags=$(pc "$1" --cflags --libs) && run_path=-Wl,-rpath,$1/lib && mkdir -p "$2" || return 1
    # shellcheck disable=SC2086  # flags are words
    gcc -std=c99 "${warnings[@]}" "$source/examples/array_state.c" $flags "$run_path" \
        -o "$2/array_state" &&
        g++ -std=c++17 "${warnings[@]}" "$source/examples/disk_check.cpp" $flags -pthread \
            "$run_path" -o "$2/disk_check"
}

# built_by_cmake TREE OUTPUT-DIRECTORY
built_by_cmake() {
    cmake -S "$source/examples" -B "$2" -DCMAKE_PREFIX_PATH="$1" \
        -DCMAKE_C_FLAGS="${warnings[*]}" -DCMAKE_CXX_FLAGS="${warnings[*]}" &&
        grep -qF "zav_DIR:PATH=$1/lib/cmake/zav" "$2/CMakeCache.txt" && cmake --build "$2"
}

# cmake_refuses VERSION TREE: a program that asks for another major version is told so.
cmake_refuses() {
    local log
    mkdir -p "$scratch/other" || return 1
    printf '%s\n' 'cmake_minimum_required(VERSION 3.16)' 'project(other C)' \
        "find_package(zav $1 REQUIRED)" >"$scratch/other/CMakeLists.txt"
    if log=$(cmake -S "$scratch/other" -B "$scratch/other/build" -DCMAKE_PREFIX_PATH="$2" 2>&1); then
        return 1
    fi
    grep -qF "$2/lib/cmake/zav/zavConfig.cmake, version: $version" <<<"$log"
}

# prints STATUS TEXT COMMAND...: on a simulated appliance, the text and nothing else.
prints() {
    local status=0 expected=$1 text=$2 output
    shift 2
    output=$(cd "$scratch" && "$ZAV_SIM" "$@" 2>&1) || status=$?
    printf '%s\nexit status %d\n' "$output" "$status"
    [ "$status" -eq "$expected" ] && [ "$output" = "$text" ]
}

four_found=$'slot 1: found\nslot 2: found\nslot 3: found\nslot 4: found'
one_failed=$'slot 1: found\nslot 2: failed\nslot 3: found\nslot 4: found'

# The examples answer what the appliance is.
examples_run() {
    local by=$1 programs=$2
    check "$by: array_state tells a normal array" prints 0 \
        "/dev/swraid/disk2p1: normal, RAID 5 of 4 disks" \
        --model 2860-4 -- "$programs/array_state" /dev/swraid/disk2p1
    check "$by: disk_check tells four healthy disks" prints 0 "$four_found" \
        --model 2860-4 -- "$programs/disk_check"
}

examples_see_a_lost_disk() {
    local programs=$1
    check "array_state tells a degraded array" prints 1 \
        "/dev/swraid/disk2p1: degraded, a disk is missing, RAID 5 of 4 disks" \
        --model 2860-4 -- sh -c "zavsim act disk 2 fails && '$programs/array_state' /dev/swraid/disk2p1"
    check "disk_check tells the failed disk" prints 2 "$one_failed" \
        --model 2860-4 -- sh -c "zavsim act disk 2 fails && '$programs/disk_check'"
    # Arrays are rebuilt one after the other: the second one waits.
    check "array_state tells a rebuild" prints 1 \
        "/dev/swraid/disk2p1: rebuilding, RAID 5 of 4 disks, 0 % done" \
        --model 2860-4 -- sh -c "for what in fails vanishes appears joins; do
            zavsim act disk 2 \$what || exit; done; '$programs/array_state' /dev/swraid/disk2p1"
    check "array_state tells an array that is not there" prints 1 \
        "/dev/swraid/disk4p1: does not exist" \
        --model 2860-4 --time-scale 100 -- "$programs/array_state" /dev/swraid/disk4p1
    check "array_state tells why there is no answer" prints 2 \
        "/dev/swraid/disk2p1: no answer, 0x80 ZAV_RC_ERR" \
        --model 2860-4 -- sh -c "zavsim act array 2 checks && '$programs/array_state' /dev/swraid/disk2p1"
    check "array_state refuses what is no address" prints 2 \
        "usage: array_state /dev/swraid/diskNp1" -- "$programs/array_state" nonsense
    check "disk_check tells that it is on no appliance" prints 3 \
        "disk_check: this is no known appliance" --bare -- "$programs/disk_check"
}

tree=$scratch/first moved=$scratch/elsewhere/second
check "the tree is installed" install_to "$tree"
check "the files are those of the list" files_are_expected "$tree"
check "the tree is installed below DESTDIR" install_staged
check "the files below DESTDIR are those of the list" files_are_expected "$scratch/stage/opt/appliance"
check "no installed text names a directory of its build" names_no_directory "$tree"
check "pkg-config tells the version" test "$(pc "$tree" --modversion)" = "$version"
check "CMake refuses another major version" cmake_refuses 2 "$tree"

check "the examples are built by pkg-config" built_by_pkg_config "$tree" "$scratch/by-pkg-config"
examples_run "pkg-config" "$scratch/by-pkg-config"
examples_see_a_lost_disk "$scratch/by-pkg-config"
check "the examples are built by CMake" built_by_cmake "$tree" "$scratch/by-cmake"
examples_run "CMake" "$scratch/by-cmake"

mkdir "$scratch/elsewhere"
check "the tree is moved" mv "$tree" "$moved"
check "pkg-config, moved tree: the examples are built" \
    built_by_pkg_config "$moved" "$scratch/moved-by-pkg-config"
examples_run "pkg-config, moved tree" "$scratch/moved-by-pkg-config"
check "CMake, moved tree: the examples are built" built_by_cmake "$moved" "$scratch/moved-by-cmake"
examples_run "CMake, moved tree" "$scratch/moved-by-cmake"
check "zavctl finds the library of the moved tree" \
    prints 0 "zavctl $version" -- "$moved/bin/zavctl" --version
finish

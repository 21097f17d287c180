#!/usr/bin/env bash
# What a caller links: symbols, needed libraries, links, headers, layout.
# usage: abi_test.sh SOURCE-DIRECTORY BUILD-DIRECTORY [COMPILER-FLAG...]
set -u
source=$1 build=$2
shift 2
flags=("$@")
scratch=$(mktemp -d "$PWD/abi.XXXXXX") # the private root shows the current directory
trap 'rm -rf "$scratch"' EXIT
. "$source/tests/check.sh"

# build_program NAME SOURCE-FILE: with the library beside it.
build_program() {
    cp -P "$build"/libzav.so* "$scratch" &&
        gcc "${flags[@]}" -std=c99 -I "$source/include" "$2" -L "$scratch" -lzav \
            -Wl,-rpath,"$scratch" -o "$scratch/$1"
}

exported() {
    nm -D --defined-only "$build/libzav.so" | awk '{print $2, $3}' | LC_ALL=C sort |
        diff "$source/tests/abi/exported.txt" -
}

only_the_c_library_is_needed() {
    readelf -d "$build/libzav.so" | sed -n 's/.*(NEEDED).*\[\(.*\)\]/\1/p' |
        { ! grep -vE '^(libc\.so\.6|libm\.so\.6|ld-linux(-x86-64)?\.so\.2)$'; }
}

soname_links() {
    [ "$(readlink "$build/libzav.so")" = libzav.so.1 ] && [ -e "$build/libzav.so.1" ] &&
        readelf -d "$build/libzav.so" | grep -q 'SONAME.*\[libzav\.so\.1\]'
}

# Each header alone, and as C++.
header() {
    local language=$1 standard=$2 name=$3
    printf '#include "%s"\n#include "%s"\nint main(void);\nint main(void) { return 0; }\n' \
        "$name" "$name" >"$scratch/header.c"
    gcc "${flags[@]}" -x "$language" "-std=$standard" -pedantic-errors -Wall -Wextra -Wshadow \
        -Wconversion -Werror -I "$source/include" -fsyntax-only "$scratch/header.c"
}

# Every exported name is declared, with a comment, in zav_api.h.
declared() {
    local name
    awk '{print $2}' "$source/tests/abi/exported.txt" | while read -r name; do
        grep -qE "[ *]$name\(" "$source/include/zav_api.h" || { echo "$name"; exit 1; }
    done
}

layouts_are_one() {
    local width
    for width in 32 64; do
        gcc "-m$width" -std=c99 -I "$source/include" "$source/tests/abi/layout.c" \
            -o "$scratch/layout$width" && "$scratch/layout$width" >"$scratch/layout$width.txt" ||
            return 1
    done
    cmp "$scratch/layout32.txt" "$scratch/layout64.txt"
}

# Names, parameters, return types and records, as the debug information tells them. A change that is
# meant is recorded by './dev abi --record'.
interface_is_the_recorded_one() {
    case " ${flags[*]} " in
    *" -m32 "*) return 0 ;; # the records are of one layout, see above
    esac
    abidiff "$source/tests/abi/libzav.so.1.abi" "$build/libzav.so.1.0.0"
}

own_names() {
    build_program own_names "$source/tests/abi/own_names.c" &&
        "$ZAV_SIM" --bare -- "$scratch/own_names"
}

# The example program of this width, on a simulated appliance whose disk 3 has failed.
answers_on_an_appliance() {
    build_program array_state "$source/examples/array_state.c" || return 1
    "$ZAV_SIM" -- bash -c "zavsim act disk 3 fails
        $scratch/array_state /dev/swraid/disk2p1" >"$scratch/answer.txt"
    [ $? -eq 1 ] && diff - "$scratch/answer.txt" <<'EOF'
/dev/swraid/disk2p1: degraded, a disk is missing, RAID 5 of 4 disks
EOF
}

check "the exported names are those of the list" exported
check "the exported names are declared in zav_api.h" declared
check "the C library alone is needed" only_the_c_library_is_needed
check "the library has its SONAME links" soname_links
for name in zav zav_event zav_led zav_rbod zav_hwraid zav_api zav_private; do
    check "$name.h is C99" header c c99 "$name.h"
    check "$name.h is C++98" header c++ c++98 "$name.h"
    check "$name.h is C++20" header c++ c++20 "$name.h"
done
check "records have one layout on 32 and 64 bits" layouts_are_one
check "the interface is the recorded one" interface_is_the_recorded_one
check "the library answers on a simulated appliance" answers_on_an_appliance
check "a caller's function with a library's name is no replacement" own_names
finish

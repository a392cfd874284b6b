#!/usr/bin/env bash
# Compares the virtual tables of the classes that library and hosts go by with their description: a compiled host calls
# operations by their slot, so an order that changes breaks it without a word. ZR_BLESS=1 in the environment writes the
# description anew.
#
#     virtual_slots.sh G++ SOURCE_ROOT
set -euo pipefail
compiler=$1 root=$2
description=$root/tests/install/virtual_slots.txt
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

"$compiler" -std=c++20 -fsyntax-only -fdump-lang-class="$work/classes" -I "$root" -I "$root/include" \
    "$root/tests/install/virtual_slots.cpp"

# Of each "Vtable for X" the entries behind the two words in front of the first slot. A class with a pure slot is left
# to its stand-in.
{
    echo "# Slots of the virtual tables, counted from 0; the first two are the destructor's where it is virtual. See virtual_slots.cpp."
    awk '
        /^Vtable for / { class = $3; text = ""; slot = -2; pure = 0; next }
        class != "" && /^[0-9]+ / {
            name = $0
            sub(/^[0-9]+ +/, "", name)
            sub(/^\(int \(\*\)\(\.\.\.\)\)/, "", name)
            if (name ~ /__cxa_pure_virtual/ || (slot >= 0 && name ~ /^0/)) pure = 1
            if (slot >= 0) text = text sprintf("%4d %s\n", slot, name)
            slot++
            next
        }
        class != "" && /^$/ {
            if (!pure && class !~ /^std::|^__/) printf "\n%s\n%s", class, text
            class = ""
        }' "$work/classes"
} >"$work/slots"

# Every class of the public headers that has a virtual table is described: by itself, or, where it is abstract, through a
# class that stands in for it.
(cd "$root/include" && printf '#include <%s>\n' zrparsersql/*.h) |
    "$compiler" -x c++ -std=c++20 -fsyntax-only -fdump-lang-class="$work/public" -I "$root/include" -
undescribed=$(awk '
    FNR == NR { if (/^[^ #]/) described[$1] = 1; next }
    FILENAME == ARGV[2] {
        if (/^Class /) class = $2
        else if (/ \(0x/ && class in described) described[$1] = 1
        next
    }
    /^Vtable for / && $3 !~ /^std::|^__/ && !($3 in described) { print $3 }' "$work/slots" "$work/classes" "$work/public")
[[ -z $undescribed ]] || { echo "without a description in virtual_slots.cpp: $undescribed" >&2; exit 1; }

if [[ -n ${ZR_BLESS:-} ]]; then
    cp "$work/slots" "$description"
else
    diff -u "$description" "$work/slots"
fi

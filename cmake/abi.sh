# shellcheck shell=sh
# The binary interface of the library: records it at a release, and compares a build with the last record.
#
# A record is what abidw finds in the library and its debugging information, cut down to what the installed headers declare,
# and beside it the version and the name of the library that it was made from.  abidiff compares two of them: bit 4 of its status
# is a difference, bit 8 one that breaks programs for certain.  Added symbols are no difference here.
# Sourced by ./package with `root` set to the repository.

# abi_record LIBRARY HEADERS FILE: writes the record of a library with debugging information, compressed.
abi_record() {
    abidw --no-corpus-path --no-comp-dir-path --no-show-locs --no-elf-needed --no-parameter-names --drop-private-types \
        --drop-undefined-syms --exported-interfaces-only --headers-dir "$2" "$1" | xz -9e >"$3"
}

# allows_break OLD NEW: whether a program for version OLD may have to be changed for version NEW: before 1.0 where the second
# number is greater, later where the first is.
allows_break() {
    old_major=${1%%.*} new_major=${2%%.*}
    old_rest=${1#*.} new_rest=${2#*.}
    [ "$new_major" -gt "$old_major" ] && return 0
    [ "$new_major" -eq 0 ] && [ "$old_major" -eq 0 ] && [ "${new_rest%%.*}" -gt "${old_rest%%.*}" ]
}

# abi_gate RECORD OLD-VERSION LIBRARY HEADERS NEW-VERSION: fails when the library breaks programs that were linked with the
# recorded one, unless its version allows that and it has another name, so that both can be installed.
abi_gate() {
    abi_old=$(mktemp --suffix=.abi)
    xz -dc "$1" >"$abi_old"
    # Two records are compared, since a library and its own record differ in what they say about the standard library.
    abi_new=$(mktemp --suffix=.abi)
    abi_record "$3" "$4" "$abi_new.xz"
    xz -dc "$abi_new.xz" >"$abi_new"
    old_name=$(sed -n "s/.*soname='\([^']*\)'.*/\1/p" "$abi_old")
    new_name=$(objdump -p "$3" | sed -n 's/ *SONAME *//p')
    abi_status=0
    abidiff --no-added-syms "$abi_old" "$abi_new" || abi_status=$?
    rm -f "$abi_old" "$abi_new" "$abi_new.xz"
    if [ $((abi_status & 3)) -ne 0 ]; then
        echo "abidiff failed with status $abi_status" >&2
        return 1
    fi
    [ $((abi_status & 12)) -ne 0 ] || return 0
    if ! allows_break "$2" "$5"; then
        echo "the interface above differs from that of $2, which version $5 does not allow: keep it, or raise the version" >&2
        return 1
    fi
    if [ "$old_name" = "$new_name" ]; then
        echo "the interface above differs from that of $2 under one name: raise VTSYM_ABI and the names of the packages" >&2
        return 1
    fi
}

# symbols LIBRARY VERSION: the lines of debian/libvtsym0.symbols, in a tree with debian/; optional ones are instances of templates.
symbols() {
    dpkg-gensymbols -q -c0 -plibvtsym0 -v"$2" -e"$1" -O"$1.symbols"
    nm -D --defined-only "$1" | awk '
        NR == FNR { defined[$3]; if ($2 ~ /^[Wu]$/) weak[$3]; next }
        /^#MISSING/ { next }
        /^ / { name = substr($1, 1, index($1, "@") - 1); sub(/^\(optional=templinst\)/, "", name)
               if (!(name in defined)) next # optional, and gone
               if (name in weak && $1 !~ /^\(/) sub(/^ /, " (optional=templinst)") }
        { print }' - "$1.symbols"
    rm -f "$1.symbols"
}

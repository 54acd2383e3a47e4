# promise: two builds are bit-identical, hardened, listed in a bill of materials, and touch nothing but the files that are named
# shellcheck shell=sh disable=SC2154 # sourced by ./campaign
#
# Two copies of the tree are built in folders of different length, a minute or more apart, with the flags of the Debian packages.  The
# short form takes the binaries that ./package has made, where it has, and else those of ./run, whose flags are not judged.
build program program vtsym_program
mkdir -p "$root/build/supply"
install_packages supply
supply=$root/build/supply

"$root/cmake/sbom.sh" >"$supply/vtsym.spdx.json"
listed=$(grep -c '"SPDXID": "SPDXRef-' "$supply/vtsym.spdx.json")
for package in $(packages_of program); do
    grep -q "\"name\": \"$package\"" "$supply/vtsym.spdx.json" || {
        echo "supply: $package is missing in the bill of materials"
        exit 1
    }
done

# is_hardened FILE: position independent, relocations read-only and bound at once, a canary, fortified calls.
is_hardened() {
    readelf -hW "$1" | grep -q 'Type:.*DYN' && readelf -dW "$1" | grep -q BIND_NOW && readelf -lW "$1" | grep -q GNU_RELRO &&
        readelf -sW --dyn-syms "$1" | grep -q __stack_chk_fail && readelf -sW --dyn-syms "$1" | grep -q '_chk@\|__stack_chk' &&
        readelf -lW "$1" | grep GNU_STACK | grep -qv RWE
}

# talks_to_nobody FILE: imports nothing of the network, and nothing that changes who it runs as.
talks_to_nobody() {
    ! readelf -sW --dyn-syms "$1" | grep -E ' UND (socket|connect|getaddrinfo|gethostbyname|bind|listen|setuid|seteuid|setgid)(@|$)'
}

binaries=''
how='of ./run, flags not judged'
if [ "$short" = no ]; then
    for copy in one another-folder; do
        tree=$supply/$copy/vtsym
        rm -rf "${supply:?}/$copy"
        mkdir -p "$tree"
        git -C "$root" ls-files -z | tar -C "$root" --null -T - -c | tar -C "$tree" -x
        export DEB_BUILD_MAINT_OPTIONS=hardening=+all DEB_CXXFLAGS_MAINT_STRIP=-g DEB_CXXFLAGS_MAINT_APPEND=-fcf-protection
        (cd "$tree" && CXXFLAGS=$(dpkg-buildflags --get CXXFLAGS) && CXXFLAGS="$CXXFLAGS $(dpkg-buildflags --get CPPFLAGS)" &&
            LDFLAGS=$(dpkg-buildflags --get LDFLAGS) && export CXXFLAGS LDFLAGS CCACHE_DISABLE=1 &&
            quietly "$supply/$copy.log" cmake --preset program && quietly "$supply/$copy.log" ninja -C build/program &&
            DESTDIR=$supply/$copy/installed quietly "$supply/$copy.log" cmake --install build/program --prefix /usr)
        sleep 60
    done
    diff -r "$supply/one/installed" "$supply/another-folder/installed" || {
        echo 'supply: two builds differ'
        exit 1
    }
    binaries=$(find "$supply/one/installed" -type f \( -name vtsym -path '*/bin/*' -o -name 'libvtsym.so.*' \))
    how="of two builds, bit-identical"
else
    binaries=$(find "$root/build/package" -type f \( -path '*/debian/tmp/usr/bin/vtsym' -o -path '*/debian/tmp/usr/lib/*/libvtsym.so.*' \) 2>/dev/null || :)
    [ -z "$binaries" ] || how='of ./package'
fi
for binary in $binaries; do
    is_hardened "$binary" || {
        echo "supply: $binary is not hardened"
        exit 1
    }
done
for binary in $binaries "$root/build/program/bin/vtsym" "$root"/build/program/lib/libvtsym.so.*; do
    talks_to_nobody "$binary" || {
        echo "supply: $binary may talk to somebody"
        exit 1
    }
done

# Files that are opened: those of the system's loader and locales, those of the program, and those that are named.
(cd "$root/examples" && strace -f -e trace=openat,open,socket,connect -o "$supply/trace" "$root/build/program/bin/vtsym" check model.json >/dev/null) || :
if grep -vE 'ENOENT|"(/etc/ld.so|/lib|/usr/lib|/usr/share/locale|/sys/devices/system/cpu|/proc/(self|cpuinfo)|model\.json)|'"\"$root/build/program/|\+\+\+|---" "$supply/trace"; then
    echo 'supply: the program opened a file that was not named'
    exit 1
fi
echo "supply: binaries $how, $(echo "$binaries" | wc -w) of them hardened; $listed entries in the bill of materials; no network, no other files"

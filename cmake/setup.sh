# Sourced by ./run and ./test with `root` set to the repository: installs what is missing, configures and builds.  Everything it
# says goes to standard error, because standard output belongs to the program.

say() {
    printf 'vtsym: %s\n' "$*" >&2
}

# quietly LOG COMMAND...: runs the command with its output in LOG, and shows that only when the command fails.
quietly() {
    log=$1
    shift
    if ! "$@" >"$log" 2>&1 </dev/null; then
        cat "$log" >&2
        say "failed: $*"
        return 1
    fi
}

missing_packages() {
    sed 's/#.*//' "$root/cmake/packages.txt" | while read -r package; do
        [ -n "$package" ] || continue
        case $installed in
        *" $package "*) ;;
        *) printf '%s ' "$package" ;;
        esac
    done
}

install_packages() {
    command -v dpkg-query >/dev/null || return 0 # no Debian: the configuration says what it does not find
    # shellcheck disable=SC2016 # the fields are dpkg-query's
    installed=" $(dpkg-query -W -f '${db:Status-Status} ${Package}\n' | sed -n 's/^installed //p' | tr '\n' ' ')"
    packages=$(missing_packages)
    [ -n "$packages" ] || return 0
    say "installing $packages"
    as_root='env'
    if [ "$(id -u)" -ne 0 ]; then
        command -v sudo >/dev/null || {
            say "neither root nor sudo: install these packages first: $packages"
            return 1
        }
        as_root='sudo env'
    fi
    apt_log=$(mktemp)
    # shellcheck disable=SC2086 # words on purpose
    quietly "$apt_log" $as_root apt-get -o DPkg::Lock::Timeout=300 update &&
        quietly "$apt_log" $as_root DEBIAN_FRONTEND=noninteractive apt-get -o DPkg::Lock::Timeout=300 install -y \
            --no-install-recommends $packages || {
        rm -f "$apt_log"
        return 1
    }
    rm -f "$apt_log"
}

# build PRESET TARGET...: leaves the targets built in build/PRESET.
build() {
    preset=$1
    shift
    directory=$root/build/$preset
    mkdir -p "$directory"
    # One set-up at a time: a second one waits and then finds everything done.
    exec 9>"$root/build/lock"
    flock 9
    install_packages || return 1
    if [ ! -f "$directory/build.ninja" ] || [ "$root/CMakePresets.json" -nt "$directory/build.ninja" ]; then
        say "building in build/$preset (this takes minutes; the next time it takes no time)"
        (cd "$root" && quietly "$directory/configure.log" cmake --preset "$preset") || {
            rm -f "$directory/build.ninja"
            return 1
        }
    fi
    quietly "$directory/build.log" ninja -C "$directory" "$@" || return 1
    exec 9>&-
}

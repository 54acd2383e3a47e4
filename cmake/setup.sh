# shellcheck shell=sh disable=SC2154,SC3013 # `root` is set by the caller, and Debian's sh knows -nt
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
    packages=${packages% }
    if [ "$(id -u)" -eq 0 ]; then
        as_root='env'
    elif command -v sudo >/dev/null; then
        as_root='sudo env'
    else
        say "neither root nor sudo: install these packages first: $packages"
        return 1
    fi
    say "installing $packages"
    apt_get="$as_root DEBIAN_FRONTEND=noninteractive apt-get -o DPkg::Lock::Timeout=300"
    # shellcheck disable=SC2086 # words on purpose
    quietly "$root/build/packages.log" $apt_get update || : # the install tells whether the old lists suffice
    # shellcheck disable=SC2086
    quietly "$root/build/packages.log" $apt_get install -y --no-install-recommends $packages
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
    quietly "$directory/build.log" ninja --quiet -C "$directory" "$@" || return 1
    exec 9>&-
}

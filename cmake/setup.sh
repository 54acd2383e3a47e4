# shellcheck shell=sh disable=SC2154,SC3013 # `root` is set by the caller, and Debian's sh knows -nt
# Sourced by ./run and ./test with `root` set to the repository: installs missing packages, configures and builds.  All of its
# messages go to standard error, because standard output belongs to the program.

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

# packages_of LIST...: the packages of cmake/packages/LIST.txt.
packages_of() {
    for list in "$@"; do
        sed -e 's/#.*//' -e '/^$/d' "$root/cmake/packages/$list.txt"
    done | sort -u
}

# missing_packages LIST...: the packages of cmake/packages/LIST.txt that are not installed.
missing_packages() {
    packages_of "$@" | while read -r package; do
        case $installed in
        *" $package "*) ;;
        *) printf '%s ' "$package" ;;
        esac
    done
}

install_packages() { # LIST...
    command -v dpkg-query >/dev/null || return 0 # no Debian: the configuration says what it does not find
    # shellcheck disable=SC2016 # the fields are dpkg-query's
    installed=" $(dpkg-query -W -f '${db:Status-Status} ${Package}\n' | sed -n 's/^installed //p' | tr '\n' ' ')"
    packages=$(missing_packages "$@")
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
    quietly "$root/build/packages.log" $apt_get update || : # the old lists may suffice
    # shellcheck disable=SC2086
    quietly "$root/build/packages.log" $apt_get install -y --no-install-recommends $packages
}

# on_one_line: shows the status lines of ninja in one line of the terminal, which is gone at the end.
on_one_line() {
    columns=$(stty size <&2 2>/dev/null | cut -d ' ' -f 2)
    [ "${columns:-0}" -gt 1 ] || columns=80
    while IFS= read -r line; do
        case $line in
        \[*) printf '\r\033[K%.*s' "$((columns - 1))" "$line" >&2 ;;
        esac
    done
    printf '\r\033[K' >&2
}

# compile DIRECTORY TARGET...: runs ninja; shows its progress on a terminal, and its messages when it fails.
compile() {
    directory=$1
    shift
    if [ -t 2 ]; then
        {
            status=0
            ninja -C "$directory" "$@" 2>&1 </dev/null || status=$?
            echo "$status" >"$directory/build.status"
        } | tee "$directory/build.log" | on_one_line
        [ "$(cat "$directory/build.status")" -eq 0 ] && return
        cat "$directory/build.log" >&2
        say "failed: ninja -C $directory $*"
        return 1
    fi
    quietly "$directory/build.log" ninja --quiet -C "$directory" "$@"
}

# build PRESET PACKAGES TARGET...: leaves the targets built in build/PRESET; PACKAGES are lists in cmake/packages.
build() {
    preset=$1
    lists=$2
    shift 2
    directory=$root/build/$preset
    mkdir -p "$directory"
    # One set-up at a time: a second one waits and then finds everything done.
    exec 9>"$root/build/lock"
    flock 9
    # shellcheck disable=SC2086 # words on purpose
    install_packages $lists || return 1
    if [ ! -f "$directory/build.ninja" ] || [ "$root/CMakePresets.json" -nt "$directory/build.ninja" ]; then
        say "building in build/$preset (takes minutes the first time, and no time afterwards)"
        (cd "$root" && quietly "$directory/configure.log" cmake --preset "$preset") || {
            rm -f "$directory/build.ninja"
            return 1
        }
    fi
    compile "$directory" "$@" || return 1
    exec 9>&-
}

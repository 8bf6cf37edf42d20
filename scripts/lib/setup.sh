# shellcheck shell=bash
# Set-up shared by the scripts: packages, configuring, building. Sourced, never run.
#
# All of it speaks on standard error and leaves standard input alone, so that both belong to the program a
# script starts in the end. What is already done costs next to nothing to ask for again.

root=$(CDPATH='' cd -- "$(dirname -- "${BASH_SOURCE[0]}")/../.." && pwd -P)
readonly root
readonly logs=$root/build/log

say() {
    printf '%s\n' "$*" >&2
}

# header FILE: its comment, without the first line and the marks.
header() {
    awk 'NR > 1 && !/^#/ { exit } NR > 1 { sub(/^# ?/, ""); print }' "$1"
}

# answer_help ARGUMENT...: shows the script's own comment and ends if the first argument asks for help. Called before
# anything is installed or built.
answer_help() {
    if [[ ${1-} == -h || ${1-} == --help ]]; then
        header "$0"
        exit 0
    fi
}

# packages_of GROUP...: the packages listed under these groups, one a line.
packages_of() {
    awk -v groups=" $* " '
        { sub(/#.*/, "") }
        /^\[/ { wanted = index(groups, " " substr($1, 2, length($1) - 2) " "); next }
        wanted && NF { print $1 }
    ' "$root/scripts/packages"
}

# missing_packages GROUP...: those of them that are not installed; all of them where dpkg cannot tell.
missing_packages() {
    local -a wanted
    mapfile -t wanted < <(packages_of "$@")
    {
        # shellcheck disable=SC2016 # the ${...} are dpkg-query's fields
        dpkg-query -W -f '${db:Status-Status} ${Package}\n' "${wanted[@]}" 2>/dev/null || :
        printf 'wanted %s\n' "${wanted[@]}"
    } | awk '$1 == "installed" { present[$2] } $1 == "wanted" && !($2 in present) { print $2 }'
}

# ensure_packages GROUP...: installs what is missing in one go, or says what to install and exits with 2.
# ZORVA_PACKAGES=skip leaves the matter to the caller, for systems where the packages have other names.
ensure_packages() {
    [[ ${ZORVA_PACKAGES-} != skip ]] || return 0
    local -a missing
    mapfile -t missing < <(missing_packages "$@")
    ((${#missing[@]} > 0)) || return 0
    can_install || ask_for_packages "${missing[@]}"
    install_packages "${missing[@]}"
}

can_install() {
    ((EUID == 0)) && command -v dpkg-query >/dev/null && command -v apt-get >/dev/null
}

# ask_for_packages PACKAGE...: the one command that is needed, then exit 2.
ask_for_packages() {
    say 'Some packages are missing. On Debian 12, install them as root with'
    say ''
    say "    apt-get install --no-install-recommends $*"
    say ''
    say 'and start again. Elsewhere, install what corresponds to them and set ZORVA_PACKAGES=skip.'
    exit 2
}

# install_packages PACKAGE...: apt-get fetches everything before it unpacks anything, so it is all or nothing.
install_packages() {
    local log=$logs/packages.log
    mkdir -p "$logs"
    say "Installing $*"
    export DEBIAN_FRONTEND=noninteractive
    # Stale lists are still lists: when the update fails, the installation decides.
    apt-get update >"$log" 2>&1 </dev/null || say 'apt-get update failed; trying with the lists at hand'
    if ! apt-get install --yes --no-install-recommends -o DPkg::Lock::Timeout=300 "$@" \
        >>"$log" 2>&1 </dev/null; then
        tail -n 20 "$log" >&2
        ask_for_packages "$@"
    fi
}

# configure PRESET [NAME=VALUE...]: makes build/PRESET ready to build, with these cache settings.
configure() {
    local preset=$1 dir=$root/build/$1 log=$logs/configure-$1.log
    shift
    ! is_configured "$dir" "$@" || return 0
    local -a command=(cmake --preset "$preset" "${@/#/-D}")
    # A cache that came here with a copy of the tree describes some other folder.
    is_ours "$dir" || command+=(--fresh)
    mkdir -p "$logs"
    say "Configuring $preset"
    if ! (cd "$root" && "${command[@]}") >"$log" 2>&1 </dev/null; then
        cat "$log" >&2
        exit 1
    fi
    touch "$dir/.configured"
}

is_ours() {
    grep -qsxF "CMAKE_HOME_DIRECTORY:INTERNAL=$root" "$1/CMakeCache.txt"
}

# is_configured DIR [NAME=VALUE...]: changed CMakeLists are ninja's to notice; the presets it does not know.
is_configured() {
    local dir=$1 setting
    shift
    [[ -f $dir/build.ninja && -f $dir/.configured ]] || return 1
    [[ ! $root/CMakePresets.json -nt $dir/.configured ]] || return 1
    is_ours "$dir" || return 1
    for setting; do
        grep -qsx "${setting%%=*}:[A-Z]*=${setting#*=}" "$dir/CMakeCache.txt" || return 1
    done
}

# build PRESET [TARGET or ninja's option...]: silent when there is little to do; the compiler's words when it fails.
build() {
    local preset=$1 log=$logs/build-$1.log pid
    shift
    mkdir -p "$logs"
    ninja -C "$root/build/$preset" "$@" >"$log" 2>&1 </dev/null &
    pid=$!
    trap 'kill "$pid" 2>/dev/null || :; exit 130' INT TERM
    show_progress "$pid" "$preset" "$log"
    if ! wait "$pid"; then
        build_errors "$log" >&2
        say "Building $preset failed; all of it is in ${log#"$root"/}"
        exit 1
    fi
    trap - INT TERM
}

# show_progress PID PRESET LOG: after a second says that it builds; later also how far it is, steadily on a
# terminal and every half minute elsewhere.
show_progress() {
    local pid=$1 preset=$2 log=$3 tenths=0
    while kill -0 "$pid" 2>/dev/null; do
        sleep 0.1
        tenths=$((tenths + 1))
        if ((tenths == 10)); then
            say "Building $preset"
        elif ((tenths > 10)) && [[ -t 2 ]]; then
            ((tenths % 5)) || printf '\r\033[K%s' "$(ninja_count "$log")" >&2
        elif ((tenths % 300 == 0)); then
            say "  $(ninja_count "$log")"
        fi
    done
    if ((tenths > 10)) && [[ -t 2 ]]; then
        printf '\r\033[K' >&2
    fi
}

# ninja_count LOG: its last "[done/all]".
ninja_count() {
    grep -o '^\[[0-9]*/[0-9]*\]' "$1" | tail -n 1 || :
}

# build_errors LOG: from the first failure on, or the end of the log if there was none.
build_errors() {
    if grep -qE '^(FAILED:|CMake Error)' "$1"; then
        awk '/^(FAILED:|CMake Error)/ { failed = 1 } failed && ++lines <= 200' "$1"
    else
        tail -n 40 "$1"
    fi
}

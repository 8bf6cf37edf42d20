# shellcheck shell=bash
# The steps of .ci/run that are more than one command. Sourced after scripts/lib/setup.sh, never run.

check_scripts() {
    shellcheck --external-sources .ci/determinism .ci/format .ci/run .ci/*.sh \
        scripts/bench scripts/fuzz scripts/run scripts/test scripts/test-kernel scripts/lib/*.sh \
        Tests/Kernel/*.sh Tests/Kernel/lib/*.sh Tests/Kernel/lib/*-root
}

# build_all PRESET: everything in it, tests included, on to the end for all that is wrong.
build_all() {
    configure "$1"
    build "$1" -k 0
}

# build_product PRESET: everything but the tests, which the other compiler's build holds to the same.
build_product() {
    configure "$1" ZORVA_TESTS=OFF
    build "$1" -k 0
}

# build_some PRESET TARGET...
build_some() {
    configure "$1"
    build "$@"
}

# tidy PRESET: the sources of the product, with the commands they are compiled with there.
tidy() {
    local tool log=${logs:?}/tidy.log sources="^${root:?}/(Shared|Host|Service|Plugin|Synth|Tools)/"
    tool=$(command -v run-clang-tidy-14 || command -v run-clang-tidy)
    if ! "$tool" -quiet -j "$(nproc)" -p "build/$1" "$sources" >"$log" 2>&1; then
        # Without its colours, its announcements of each file and its counts of what it keeps to itself.
        sed 's/\x1b\[[0-9;]*m//g' "$log" |
            grep -vE '^clang-tidy-14 |^[0-9]+ warnings? (generated|treated)|^Suppressed '
        return 1
    fi
    printf '%s sources.\n' "$(grep -c '^clang-tidy-14 ' "$log")"
}

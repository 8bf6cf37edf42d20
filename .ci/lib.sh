# shellcheck shell=bash
# What the checks share. Sourced, never run.

root=$(CDPATH='' cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd -P)
readonly root

# of_git ARGUMENT...: git in this tree, whoever owns it.
of_git() {
    git -C "$root" -c safe.directory="$root" "$@"
}

# project_files [PATTERN...]: what is tracked or about to be, as existing files, one a line. A tree without
# git stands as a whole, apart from what is built.
project_files() {
    local file
    if of_git rev-parse --git-dir >/dev/null 2>&1; then
        of_git ls-files --cached --others --exclude-standard -- "$@"
    else
        (cd "$root" && find . -name build -prune -o -type f -print) | sed 's,^\./,,' | matching "$@"
    fi | while IFS= read -r file; do
        [[ ! -f $root/$file ]] || printf '%s\n' "$file"
    done
}

# matching [PATTERN...]: the lines that match one of the shell patterns; all of them when there are none.
matching() {
    local line pattern
    while IFS= read -r line; do
        for pattern in "${@:-*}"; do
            # shellcheck disable=SC2053 # a pattern is meant
            [[ $line != $pattern ]] || printf '%s\n' "$line"
        done
    done
}

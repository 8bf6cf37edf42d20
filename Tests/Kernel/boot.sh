#!/usr/bin/env bash
# The machine comes up with the host's root, which it cannot change, and the modules load.
# quick
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid iio
for node in /dev/uhid /dev/uinput; do
    [[ -c $node ]] || fail "no $node"
done
expect 'the bus of sensors is there' yes "$([[ -d /sys/bus/iio ]] && echo yes)"

touch /etc/written-in-the-machine
expect 'the root can be written to' yes "$([[ -f /etc/written-in-the-machine ]] && echo yes)"
expect 'the tree cannot' no "$(touch "${tree:?}/written-in-the-machine" 2>/dev/null && echo yes || echo no)"

echo kept >"${out:?}/kept"
expect 'what is kept reads back' kept "$(cat "$out/kept")"

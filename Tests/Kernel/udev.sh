#!/usr/bin/env bash
# Where udevd runs, it learns of a touch surface that comes and knows it by its serial number.
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
start_udev
coproc surface { exec zorvatouch-uhid-surface --serial SER-45; }
# shellcheck disable=SC2154 # coproc sets it
readonly player=$surface_PID
node=
while [[ -z $node ]] && read -r -t 30 -u "${surface[0]}" line; do
    [[ ! $line =~ \"event\":\"bound\".*\"node\":\"([^\"]*)\" ]] || node=${BASH_REMATCH[1]}
done
expect 'the surface has a node' /dev/hidraw0 "$node"
udevadm wait --initialized=true --timeout=30 "$node" || fail 'udevd does not handle it'
expect 'udevd has handled it, as a hidraw device' hidraw \
    "$(udevadm info --query=property --property=SUBSYSTEM --value "$node")"
hid=$(dirname -- "$(dirname -- "$(udevadm info --query=path "$node")")")
expect 'of a device with the serial number' SER-45 \
    "$(udevadm info --query=property --property=HID_UNIQ --value --path="$hid")"

kill "$player"
wait "$player"
udevadm wait --removed --timeout=30 "$node"
expect 'and the node goes' no "$([[ -e $node ]] && echo yes || echo no)"

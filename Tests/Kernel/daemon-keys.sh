#!/usr/bin/env bash
# A finger on a surface that udevd tells of gives the keys that its labels say, in order and number.
# quick
# limit 180
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
start_udev
exec /usr/bin/python3 "${tests:?}/daemon-keys.py"

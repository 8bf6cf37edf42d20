#!/usr/bin/env bash
# A daemon whose surface nobody touches does not wake up.
# limit 120
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
start_udev
start_bus    # a daemon without one connects again and again
exec /usr/bin/python3 "${tests:?}/daemon-idle.py"

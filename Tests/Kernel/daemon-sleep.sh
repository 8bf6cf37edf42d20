#!/usr/bin/env bash
# A key that is down is released before the machine is let to sleep.
# limit 150
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
start_bus
exec /usr/bin/python3 "${tests:?}/daemon-sleep.py"

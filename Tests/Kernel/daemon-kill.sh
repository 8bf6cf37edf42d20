#!/usr/bin/env bash
# A daemon that is killed takes its keyboard along, its successor works, and one that nobody listens to goes on.
# limit 120
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
exec /usr/bin/python3 "${tests:?}/daemon-kill.py"

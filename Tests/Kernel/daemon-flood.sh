#!/usr/bin/env bash
# A flood of nonsense leaves the daemon alive and small, its log short and no key down.
# limit 300
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
exec /usr/bin/python3 "${tests:?}/daemon-flood.py"

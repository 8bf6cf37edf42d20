#!/usr/bin/env bash
# A node that another device has taken is not read, and two daemons do not share a surface.
# limit 120
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
exec /usr/bin/python3 "${tests:?}/daemon-node.py"

#!/usr/bin/env bash
# Debug reports are answered, refused or kept waiting for, while the daemon gives keys.
# limit 180
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
exec /usr/bin/python3 "${tests:?}/daemon-features.py"

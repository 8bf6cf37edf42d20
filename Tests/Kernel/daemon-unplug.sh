#!/usr/bin/env bash
# A surface that is unplugged with a key down lets go of it, and works again when it comes back under another name.
# quick
# limit 120
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
exec /usr/bin/python3 "${tests:?}/daemon-unplug.py"

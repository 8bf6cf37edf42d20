#!/usr/bin/env bash
# A keyboard made with libevdev gives its keys to whoever reads its node, until it goes.
# quick
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
exec /usr/bin/python3 "${tests:?}/uinput.py"

#!/usr/bin/env bash
# A touch surface that a program plays has a node whose reader gets its reports and whose requests are answered.
# quick
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
exec /usr/bin/python3 "${tests:?}/hidraw.py"

#!/usr/bin/env bash
# How long a key takes from the report that decides, with real-time priority and without.
# limit 300
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid
exec /usr/bin/python3 "${tests:?}/daemon-latency.py"

#!/usr/bin/env bash
# After 200 times unplugging and plugging in no descriptor, thread or memory is left behind, and no key is down.
# limit 300
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid iio
start_udev
exec /usr/bin/python3 "${tests:?}/daemon-cycles.py"

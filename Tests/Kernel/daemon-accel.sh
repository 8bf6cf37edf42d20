#!/usr/bin/env bash
# The recording has the accelerometer around touches; one that goes does not matter to keys, one that comes is used.
# limit 180
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid iio
exec /usr/bin/python3 "${tests:?}/daemon-accel.py"

#!/usr/bin/env bash
# An accelerometer that a program plays becomes an IIO device whose buffer has gravity, bumps and the kernel's clock.
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

load hid iio
exec /usr/bin/python3 "${tests:?}/accel.py"

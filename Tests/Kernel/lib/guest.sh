# shellcheck shell=bash
# What the tests share inside their machine. Sourced by them first, never run.
set -euo pipefail

# shellcheck disable=SC1091 # written when the machine is started
source /run/lab/settings
# shellcheck disable=SC2034 # for the tests
readonly tests=${tree:?}/Tests/Kernel
# shellcheck disable=SC2034
readonly out=/run/lab/out    # kept, as build/kernel/NAME/out
export PATH=$tree/build/release/bin:$PATH
export PYTHONDONTWRITEBYTECODE=1 PYTHONUNBUFFERED=1

fail() {
    printf 'FAILED: %s\n' "$*"
    exit 1
}

# expect WHAT WANTED GOT
expect() {
    [[ $2 == "$3" ]] || fail "$1: expected '$2', got '$3'"
    printf 'ok: %s\n' "$1"
}

# load SET...: the kernel's modules of these: hid (uhid, hidraw, uinput, evdev), iio (accelerometers).
load() {
    local set module
    for set; do
        while IFS= read -r module; do
            insmod "/run/lab/modules/$module.ko" || fail "module $module does not load"
        done <"/run/lab/modules/$set"
    done
}

# start_udev: runs udevd, which from now on sees what comes and goes.
start_udev() {
    if [[ ! -x /lib/systemd/systemd-udevd ]]; then
        tar -C "${udev:?}" -c . | tar -C / -x --keep-directory-symlink
    fi
    /lib/systemd/systemd-udevd --daemon
    udevadm settle --timeout=30
}

# start_bus: a system bus on which everything is allowed.
start_bus() {
    mkdir -p /run/dbus
    cat >/run/bus.conf <<'BUS'
<!DOCTYPE busconfig PUBLIC "-//freedesktop//DTD D-Bus Bus Configuration 1.0//EN"
  "http://www.freedesktop.org/standards/dbus/1.0/busconfig.dtd">
<busconfig>
  <type>system</type>
  <listen>unix:path=/run/dbus/system_bus_socket</listen>
  <auth>EXTERNAL</auth>
  <policy context="default">
    <allow user="*"/>
    <allow own="*"/>
    <allow send_type="method_call"/>
    <allow send_type="signal"/>
    <allow send_requested_reply="true"/>
    <allow receive_type="method_call"/>
    <allow receive_type="method_return"/>
    <allow receive_type="error"/>
    <allow receive_type="signal"/>
  </policy>
</busconfig>
BUS
    dbus-daemon --config-file=/run/bus.conf --fork --print-address=1
}

#!/usr/bin/env bash
# A user whom udev's rules let in gets keys; a refusal of real-time priority is one line in the log.
# limit 180
# shellcheck source-path=SCRIPTDIR source=lib/guest.sh
source "$(dirname -- "${BASH_SOURCE[0]}")/lib/guest.sh"

readonly group=4242
echo "zorvatouch:x:$group:" >>/etc/group
mkdir -p /etc/udev/rules.d
cat >/etc/udev/rules.d/70-zorvatouch.rules <<'RULES'
SUBSYSTEM=="hidraw", KERNELS=="*:1234:ABCD.*", GROUP="zorvatouch", MODE="0660"
SUBSYSTEM=="misc", KERNEL=="uinput", GROUP="zorvatouch", MODE="0660", OPTIONS+="static_node=uinput"
RULES
load hid
start_udev
udevadm trigger --action=add --settle /sys/class/misc/uinput
expect 'the rules are in effect' 'zorvatouch 660' "$(stat -c '%G %a' /dev/uinput)"
exec /usr/bin/python3 "${tests:?}/daemon-user.py" "$group"

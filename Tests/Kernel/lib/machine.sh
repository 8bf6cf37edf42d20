# shellcheck shell=bash
# Runs one test in a virtual machine. Sourced by scripts/test-kernel after kernel.sh, never run.
# shellcheck disable=SC2034 # `why` and `log` are for the caller

# run_machine NAME SECONDS: the test in a fresh machine. Its words are in build/kernel/NAME/result.log, the
# kernel's in console.log, what it keeps in out/. Fails if the test did; then `why` says how and `log` where to
# look.
#
# Only the test's own last line is believed: the virtual machine ends alike after a shutdown and a panic.
run_machine() {
    local name=$1 limit=$2 folder=${kernel_dir:?}/$1 last status=0
    rm -rf "$folder"
    mkdir -p "$folder/out"
    : >"$folder/result.log"
    start_machine "$name" "$limit" "$folder" || status=$?
    last=$(tail -n 1 "$folder/result.log" | tr -d '\r')
    [[ $status/$last != '0/EXIT 0' ]] || return 0
    log=$folder/result.log
    if ((status == 124 || status == 137)); then
        why="not done after $limit s"
    elif ((status != 0)); then
        why="the machine ended with $status"
        log=$folder/machine.log
    elif [[ $last == 'EXIT '* ]]; then
        why=${last,,}
    else
        why='no result'
        log=$folder/console.log
    fi
    return 1
}

# start_machine NAME SECONDS FOLDER: the same emulation everywhere, whatever the processor could do.
start_machine() {
    local name=$1 limit=$2 folder=$3 pid status=0
    local -a options=(-accel tcg -cpu max -m 1024 -smp 1 -display none -nodefaults -no-reboot
        -kernel "${vmlinux:?}" -initrd "${initramfs:?}"
        -append "console=ttyS0 quiet panic=-1 zorva.test=$name"
        -serial "file:$folder/console.log" -serial "file:$folder/result.log"
        -fsdev "local,id=root,path=/,security_model=none,readonly=on,multidevs=remap"
        -device "virtio-9p-pci,fsdev=root,mount_tag=hostroot"
        -fsdev "local,id=out,path=${folder//,/,,}/out,security_model=none"
        -device "virtio-9p-pci,fsdev=out,mount_tag=out")
    timeout --foreground --kill-after=5 "$limit" \
        qemu-system-x86_64 "${options[@]}" >"$folder/machine.log" 2>&1 </dev/null &
    pid=$!
    trap 'kill "$pid" 2>/dev/null || :; exit 130' INT TERM
    wait "$pid" || status=$?
    trap - INT TERM
    return "$status"
}

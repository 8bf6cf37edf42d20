# shellcheck shell=bash
# Gets a kernel for the tests' machines: Debian's own, downloaded once and kept below build/kernel/cache with the
# few modules that are needed. Sourced by scripts/test-kernel after scripts/lib/setup.sh, never run.

cache=${kernel_dir:?}/cache
readonly cache

# Modules in the order in which they load. `root_modules` before anything else, the others when a test asks.
readonly root_modules=(virtio_ring virtio virtio_pci_modern_dev virtio_pci_legacy_dev virtio_pci netfs fscache
    9pnet 9pnet_virtio 9p overlay)
readonly hid_modules=(hid uhid hid-generic uinput evdev)
readonly iio_modules=(industrialio kfifo_buf industrialio-triggered-buffer hid-sensor-hub hid-sensor-iio-common
    hid-sensor-trigger hid-sensor-accel-3d)

# prepare_kernel: sets `vmlinux`, `initramfs` and `udev`; ends the script with 2 if something cannot be had.
prepare_kernel() {
    local package
    mkdir -p "$cache" "${logs:?}"
    package=$(kernel_package)
    [[ -f $cache/$package/ready ]] || fetch_kernel "$package"
    # shellcheck disable=SC2034 # for machine.sh
    vmlinux=$cache/$package/vmlinux
    initramfs=$cache/initramfs.gz
    udev=$cache/udev
    [[ -x /lib/systemd/systemd-udevd || -f $udev/ready ]] || fetch_udev
    make_initramfs "$cache/$package/modules"
}

# kernel_package: the name of the current kernel's package, or of one that is here if apt knows none.
kernel_package() {
    local package file
    package=$(known_kernel)
    if [[ -z $package ]]; then
        for file in "$cache"/linux-image-*/ready; do
            [[ ! -f $file ]] || package=$(basename -- "$(dirname -- "$file")")
        done
    fi
    if [[ -z $package ]] && can_install; then
        apt-get update >"$logs/kernel-download.log" 2>&1 </dev/null || :
        package=$(known_kernel)
    fi
    if [[ -z $package ]]; then
        say 'apt knows no linux-image-amd64: this is no Debian of that kind, or apt-get update is due.'
        exit 2
    fi
    echo "$package"
}

# known_kernel: what apt's lists have; nothing without them.
known_kernel() {
    { apt-cache depends linux-image-amd64 2>/dev/null || :; } | awk '$1 == "Depends:" && !n++ { print $2 }'
}

# download PACKAGE FOLDER: its file, into an empty folder; once more with fresh lists when these are stale.
download() {
    local log=$logs/kernel-download.log
    rm -rf "$2"
    mkdir -p "$2"
    say "Downloading $1"
    (cd "$2" && apt-get download "$1") >"$log" 2>&1 </dev/null && return 0
    ! can_install || apt-get update >>"$log" 2>&1 </dev/null || :
    (cd "$2" && apt-get download "$1") >>"$log" 2>&1 </dev/null && return 0
    tail -n 20 "$log" >&2
    say "$1 cannot be downloaded."
    exit 2
}

# fetch_kernel PACKAGE: FOLDER/vmlinux and FOLDER/modules/NAME.ko, and FOLDER/ready when all is there.
fetch_kernel() {
    local folder=$cache/$1
    download "$1" "$folder"
    unpack_modules "$folder"
    unpack_vmlinux "$folder"
    rm -rf "$folder"/*.deb "$folder/unpacked"
    touch "$folder/ready"
    find "$cache" -maxdepth 1 -name 'linux-image-*' ! -name "$1" -exec rm -rf {} +
}

unpack_modules() {
    local folder=$1 module file
    local -a patterns=('./boot/vmlinuz-*')
    for module in "${root_modules[@]}" "${hid_modules[@]}" "${iio_modules[@]}"; do
        patterns+=("*/kernel/*/$module.ko")
    done
    mkdir -p "$folder/unpacked" "$folder/modules"
    dpkg-deb --fsys-tarfile "$folder"/*.deb | tar -x -C "$folder/unpacked" --wildcards "${patterns[@]}"
    find "$folder/unpacked" -name '*.ko' | while IFS= read -r file; do
        mv -- "$file" "$folder/modules/"
    done
}

# number_at FILE OFFSET BYTES: little-endian, as this machine.
number_at() {
    od -A n -t "u$3" -j "$2" -N "$3" "$1" | tr -d ' '
}

# unpack_vmlinux FOLDER: the kernel as the machine starts it at once, without unpacking itself: seconds for
# each start. The boot protocol's header tells where the packed one lies.
unpack_vmlinux() {
    local folder=$1 image start length
    image=$(echo "$folder"/unpacked/boot/vmlinuz-*)
    start=$((($(number_at "$image" $((0x1f1)) 1) + 1) * 512 + $(number_at "$image" $((0x248)) 4)))
    length=$(number_at "$image" $((0x24c)) 4)
    dd if="$image" of="$folder/unpacked/vmlinux.xz" bs=64K iflag=skip_bytes,count_bytes \
        skip="$start" count="$length" status=none
    xz -dc --single-stream "$folder/unpacked/vmlinux.xz" >"$folder/vmlinux"
}

# fetch_udev: the host's udev package, unpacked: this machine itself may do without.
fetch_udev() {
    download udev "$udev"
    dpkg-deb -x "$udev"/*.deb "$udev/unpacked"
    rm "$udev"/*.deb
    touch "$udev/ready"
}

# make_initramfs MODULES: what a machine starts with, until it has this machine's root as its own.
make_initramfs() {
    local modules=$1 stage=$cache/stage
    rm -rf "$stage"
    mkdir -p "$stage"/{bin,dev,proc,sys,host,layer,new,modules}
    # It becomes a root directory, which others than root must be able to enter.
    chmod 755 "$stage"
    cp /bin/busybox "$stage/bin/"
    cp "$modules"/*.ko "$stage/modules/"
    printf '%s\n' "${root_modules[@]}" >"$stage/modules/root"
    printf '%s\n' "${hid_modules[@]}" >"$stage/modules/hid"
    printf '%s\n' "${iio_modules[@]}" >"$stage/modules/iio"
    install -m 755 "${tests:?}/lib/first-root" "$stage/init"
    {
        printf 'tree=%q\n' "${root:?}"
        printf 'udev=%q\n' "$udev/unpacked"
    } >"$stage/settings"
    (cd "$stage" && find . | cpio --quiet -o -H newc -R 0:0 | gzip -1) >"$initramfs"
    rm -rf "$stage"
}

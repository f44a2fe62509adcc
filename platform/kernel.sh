# SPDX-License-Identifier: Apache-2.0
# Debian's kernel with the Binder driver, and the initramfs that starts it. Sourced by ./dev.
# shellcheck shell=bash disable=SC2153,SC2034 # variables shared with ./dev and vm.sh

# In the order in which they are loaded. Input devices are made by tests.
KERNEL_MODULES=(virtio_ring virtio virtio_pci_modern_dev virtio_pci_legacy_dev virtio_pci
    virtio_console netfs fscache 9pnet 9pnet_virtio 9p evdev uinput binder_linux)

VM_KERNEL=$ZELK_CACHE/kernel/bookworm-$(printf '%s\n' "${KERNEL_MODULES[@]}" | short_hash)

needs_kernel() {
    [[ $VM_MODE == qemu && ! -d $VM_KERNEL ]]
}

ensure_kernel() {
    make_cached kernel "$VM_KERNEL" 200 "fetching Debian's kernel (about 70 MB)" unpack_kernel
}

# Sets VM_VMLINUX and VM_INITRAMFS. The kernel is the newest that the archive had when it was first needed.
ensure_vm_image() {
    local folder key
    ensure_kernel
    key=$({ printf '%s\n' "$VM_KERNEL" && cat "$VM_KERNEL/version" "$ROOT/platform/vm-init" /bin/busybox; } |
        short_hash)
    folder=$ZELK_CACHE/initramfs/$key
    make_cached initramfs "$folder" 20 "making the initramfs" make_initramfs "$VM_KERNEL"
    VM_INITRAMFS=$folder/initramfs
    folder=$VM_KERNEL-uncompressed
    make_cached uncompressed "$folder" 100 "uncompressing the kernel" uncompress_kernel "$VM_KERNEL/vmlinuz"
    VM_VMLINUX=$folder/vmlinux
}

# Only the image and the modules named above are kept, out of 400 MB.
unpack_kernel() {
    local scratch=$1 package
    local -a files=("${KERNEL_MODULES[@]/#/*/}")
    files=("${files[@]/%/.ko}")
    update_private_lists || exit
    package=$(private_apt apt-cache depends linux-image-amd64 | awk '$1 == "Depends:" { print $2; exit }')
    [[ -n $package ]] || die "Debian's archive has no linux-image-amd64"
    cd -- "$scratch" || exit
    run_logged "the kernel cannot be fetched" private_apt apt-get download "$package"
    mkdir -p result/modules unpacked
    dpkg-deb --fsys-tarfile "$package"_*.deb |
        tar -C unpacked -xf - --wildcards './boot/vmlinuz-*' "${files[@]}" ||
        die "the kernel package $package cannot be unpacked"
    find unpacked/lib -name '*.ko' -exec mv -t result/modules {} +
    mv unpacked/boot/vmlinuz-* result/vmlinuz
    printf '%s\n' "$package"_*.deb >result/version
}

make_initramfs() {
    local kernel=$1 scratch=$2 root=$2/root module
    mkdir -p -- "$root/bin" "$root/modules" "$scratch/result"
    cp /bin/busybox "$root/bin/"
    install -m 755 "$ROOT/platform/vm-init" "$root/init"
    for module in "${KERNEL_MODULES[@]}"; do
        cp "$kernel/modules/$module.ko" "$root/modules/"
        printf '/modules/%s.ko\n' "$module" >>"$root/modules/order"
    done
    (cd "$root" && find . | cpio --quiet -o -H newc) >"$scratch/result/initramfs"
}

# The kernel of a bzImage, which would take half of an emulated boot to uncompress itself. Where it lies is told in the
# image's header: how many sectors the code in front of it has, and then its place behind these and its length
# (the boot protocol's setup_sects, payload_offset and payload_length).
uncompress_kernel() {
    local image=$1 scratch=$2 sectors offset length
    sectors=$(image_number "$image" 0x1f1 1)
    offset=$(image_number "$image" 0x248 4)
    length=$(image_number "$image" 0x24c 4)
    mkdir -p -- "$scratch/result"
    # Behind the compressed data is the length of the other.
    dd "if=$image" bs=64K iflag=skip_bytes,count_bytes "skip=$(((sectors + 1) * 512 + offset))" "count=$length" status=none |
        xz -dc --single-stream >"$scratch/result/vmlinux" ||
        die "the kernel in $image cannot be uncompressed"
}

# image_number <file> <offset> <bytes>
image_number() {
    od -An -t "u$3" -j "$2" -N "$3" -- "$1" | tr -d ' '
}

#!/bin/bash
# boot_systemd.sh ROOT: makes systemd the first process of ROOT, in mount, process, IPC, host name, network and control
# group namespaces of its own, and runs until it is killed with SIGKILL; nothing is left then. Its only child is that
# process, whose namespaces `nsenter` enters.
set -euo pipefail

# The first part of the work: a control group of its own, which then is the root of all groups that systemd sees.
if [ "$1" != inside ]; then
    if [ -e /sys/fs/cgroup/cgroup.controllers ]; then
        hierarchies=(/sys/fs/cgroup)
    else  # a host that still has the hierarchies of version 1
        hierarchies=(/sys/fs/cgroup/systemd /sys/fs/cgroup/unified)
    fi
    for hierarchy in "${hierarchies[@]}"; do
        mkdir -p "$hierarchy/lapdmon-packages-$$"
        echo $$ >"$hierarchy/lapdmon-packages-$$/cgroup.procs"
    done
    exec unshare --mount --pid --uts --ipc --cgroup --net --fork --kill-child "$0" inside "$1"
fi

root=$2
mount --make-rprivate /
mount --bind "$root" "$root"
mount -t proc proc "$root/proc"
mount -t sysfs -o ro sysfs "$root/sys"
for folder in run tmp dev; do
    mount -t tmpfs -o mode=755 tmpfs "$root/$folder"
done
chmod 1777 "$root/tmp"
for device in null zero full random urandom tty; do
    touch "$root/dev/$device"
    mount --bind "/dev/$device" "$root/dev/$device"
done
mkdir "$root/dev/shm" "$root/dev/pts"
mount -t tmpfs tmpfs "$root/dev/shm"
mount -t devpts -o newinstance,ptmxmode=0666 devpts "$root/dev/pts"
ln -s pts/ptmx "$root/dev/ptmx"
groups=$root/sys/fs/cgroup
if [ -e /sys/fs/cgroup/cgroup.controllers ]; then
    mount -t cgroup2 cgroup2 "$groups"
else
    mount -t tmpfs -o mode=755 tmpfs "$groups"
    mkdir "$groups/systemd" "$groups/unified"
    mount -t cgroup -o none,name=systemd cgroup "$groups/systemd"
    mount -t cgroup2 cgroup2 "$groups/unified"
fi
tr -d - </proc/sys/kernel/random/uuid >"$root/etc/machine-id"
cd "$root"
mkdir -p host
pivot_root . host
umount -l /host
exec env -i container=chroot PATH=/usr/sbin:/usr/bin /lib/systemd/systemd --system --log-target=null

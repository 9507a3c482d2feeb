# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Creates clean Debian systems, each in its own folder, for the scripts that run something in them; sourced
# after common.sh. The script must set root, the folder of the system, which is saved as $root.tar.zst.
# shellcheck shell=bash disable=SC2154

# apart COMMAND...: runs it as root in its own mount namespace: everything mounted there is gone as soon
# as the command ends, however it ends.
apart() {
    as_root unshare --mount --pid --fork --kill-child "$@"
}

# in_root COMMAND...: runs it in the clean Debian.
in_root() {
    # shellcheck disable=SC2016 # expanded by the inner shell
    apart bash -euc 'root=$0
        mount -t proc proc "$root/proc"
        mount --rbind /dev "$root/dev"
        exec env -i PATH=/usr/sbin:/usr/bin:/sbin:/bin HOME=/root LC_ALL=C.UTF-8 \
            DEBIAN_FRONTEND=noninteractive CMAKE_BUILD_PARALLEL_LEVEL="$(nproc)" chroot "$root" "$@"' "$root" "$@"
}

remove_root() {
    as_root rm -rf --one-file-system "$root"
}

# make_root SUITE ARCHITECTURE PACKAGE...: creates a new system with these packages, using the mirror and the
# proxy that apt uses on this machine.
make_root() {
    local suite=$1 architecture=$2 mirror
    shift 2
    as_root apt-get update -qq
    # shellcheck disable=SC2016 # expanded by apt-get
    mirror=$(apt-get indextargets --format '$(REPO_URI)' \
        'Created-By: Packages' 'Label: Debian' 'Component: main' | sed -n 1p)
    [ -n "$mirror" ] || { echo "$0: apt has no mirror of Debian" >&2; return 1; }
    eval "$(apt-config shell http_proxy Acquire::http::Proxy)"
    apart env http_proxy="${http_proxy:-}" debootstrap --variant=minbase --arch="$architecture" \
        --include=ca-certificates "$suite" "$root" "$mirror"
    { apt-config dump --no-empty --format '%F "%v";%n' Acquire; echo 'APT::Get::Assume-Yes "true";'; } |
        as_root tee "$root/etc/apt/apt.conf.d/90clean-root" >/dev/null
    as_root cp -L /etc/resolv.conf "$root/etc/resolv.conf"
    in_root apt-get update
    in_root apt-get install --no-install-recommends "$@"
    in_root apt-get clean
    as_root tar -C "$root" --zstd -cf "$root.tar.zst.new" .
    mv -f "$root.tar.zst.new" "$root.tar.zst"
}

# fresh_root SUITE ARCHITECTURE PACKAGE...: unpacks the saved clean Debian, or creates it again if one of the
# scripts that create it has changed.
fresh_root() {
    local kept=$root.tar.zst
    remove_root
    if [ "$kept" -nt scripts/release/roots.sh ] && [ "$kept" -nt scripts/common.sh ] && [ "$kept" -nt "$0" ]; then
        as_root mkdir -p "$root"
        as_root tar -C "$root" --zstd -xpf "$kept"
        as_root cp -L /etc/resolv.conf "$root/etc/resolv.conf"
    else
        mkdir -p "$(dirname "$root")"
        make_root "$@"
    fi
}

# clone_into_root: copies what is committed to /home/vornjsondb in the clean Debian.
clone_into_root() {
    rm -rf "$root.clone"
    git clone --quiet --no-checkout . "$root.clone"
    git -C "$root.clone" checkout --quiet "$(git rev-parse HEAD)"
    as_root cp -r "$root.clone" "$root/home/vornjsondb"
    rm -rf "$root.clone"
}

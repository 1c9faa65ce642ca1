# shellcheck shell=bash
#
# Functions for scripts that need a clean Debian system, made by debootstrap in a temporary directory.
# To be sourced; scripts/package-trial and scripts/try-releases do.
#
# The caller calls enter_own_mounts first. What it has in $work, the temporary directory, and mounts at
# $root, a directory in it, is removed when it ends, whatever happens.

step() { printf '\n== %s (%d s)\n' "$*" "$SECONDS" >&2; }

# enter_own_mounts COMMAND...: the calling script, COMMAND, goes on as root in a mount namespace of its
# own, where mounts end with it, even when it is killed.
enter_own_mounts() {
  [ "$(id -u)" -eq 0 ] || {
    echo "$1: only root can make a Debian system to try things in" >&2
    exit 1
  }
  if [ "${SECPOLICY_HAS_OWN_MOUNTS-}" != yes ]; then
    SECPOLICY_HAS_OWN_MOUNTS=yes exec unshare --mount --propagation private "$@"
  fi
  work=$(mktemp -d)
  root=$work/root
  trap remove_root EXIT
  trap 'exit 1' HUP INT TERM
}

unmount_root() {
  if mountpoint -q "$root"; then umount -R "$root"; fi
}

remove_root() {
  end_processes
  unmount_root
  # What could not be unmounted is not looked into.
  rm -rf --one-file-system "$work"
}

# in_namespaces PROC COMMAND...: runs it with mounts and process ids of its own, whose /proc is mounted at
# PROC. Nothing that it starts or mounts outlives it or the calling script. It runs in the background
# because bash handles a signal only when the command in the foreground has ended; there, SIGINT and
# SIGQUIT would be ignored unless they were reset.
in_namespaces() {
  local status=0
  setpriv --pdeathsig KILL \
    unshare --pid --fork --kill-child --mount-proc="$1" env --default-signal "${@:2}" <&0 &
  namespaces_pid=$!
  wait "$namespaces_pid" || status=$?
  namespaces_pid=
  return "$status"
}

# Kills what in_namespaces still runs. The kernel ends all processes of the namespace with its first one.
end_processes() {
  local first=
  [ -n "${namespaces_pid-}" ] || return 0
  read -r first <"/proc/$namespaces_pid/task/$namespaces_pid/children" || true
  kill -KILL "${first:-$namespaces_pid}" || true
  wait "$namespaces_pid" || true
} 2>/dev/null

# inside COMMAND...: runs it in the system. The system's root becomes that of the mount namespace: in a
# directory entered by chroot, the kernel lets no ordinary user create a user namespace.
inside() {
  LC_ALL=C.UTF-8 DEBIAN_FRONTEND=noninteractive in_namespaces "$root/proc" \
    sh -c 'cd "$0" && pivot_root . mnt && umount -l /mnt && exec "$@"' "$root" "$@"
}

install_packages() { inside apt-get install -q -y --no-install-recommends "$@" >"$work/apt.log" 2>&1 || {
  cat "$work/apt.log" >&2
  return 1
}; }

own_release() { (. /etc/os-release && echo "$VERSION_CODENAME"); }

# The mirror that this machine's own packages come from.
own_mirror() {
  apt-get indextargets --format '$(SITE) $(CODENAME)' \
    'Created-By: Packages' 'Origin: Debian' 'Component: main' |
    sed -n "s/ $(own_release)\$//p" | head -n 1
}

# make_root RELEASE: a minimal system of the release, running as far as programs in it need.
make_root() {
  local mirror
  mirror=$(own_mirror)
  [ -n "$mirror" ] || {
    echo "apt-get names no Debian mirror for $(own_release)" >&2
    return 1
  }
  in_namespaces /proc /usr/sbin/debootstrap --variant=minbase "$1" "$root" "$mirror" >"$work/debootstrap.log" || {
    tail -n 20 "$work/debootstrap.log" >&2
    return 1
  }
  # pivot_root takes only a mount point.
  mount --bind "$root" "$root"
  cp -L /etc/resolv.conf "$root/etc/resolv.conf"
  mount -t sysfs -o ro sysfs "$root/sys"
  mount --bind /dev "$root/dev"
  mount --bind /dev/pts "$root/dev/pts"
}

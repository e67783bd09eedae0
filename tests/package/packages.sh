#!/usr/bin/env bash
# packages.sh FOLDER: installs the packages of the folder in a copy of the system that is gone afterwards, builds the examples with
# what they bring, starts the gateway as its unit says, and places a call.
set -euo pipefail

fail() { echo "FAILED: $*" >&2; exit 1; }

# --- in the copy, where this is /root/packages.sh

expect_call() {
    sipp 127.0.0.1:33400 -sn uas -i 127.0.0.1 -p 33403 -m 1 -nostdin -timeout 30s -timeout_error >/root/uas.out 2>&1 &
    local callee=$! i
    for ((i = 0; i < 200; i++)); do ss -Huln 'sport = :33403' | grep -q . && break; sleep 0.05; done
    sipp 127.0.0.1:33400 -sn uac -s 4989123 -i 127.0.0.1 -p 33401 -d 200 -m 1 -nostdin -timeout 30s -timeout_error >/root/uac.out 2>&1 ||
        fail "the caller: exit status $?: $(cat /root/gateway.log)"
    wait $callee || fail "the callee: exit status $?"
}

# unit KEY: its value
unit() { sed -n "s/^$1=//p" /lib/systemd/system/callcontrol-gateway.service; }

# as_unit COMMAND...: by the user of the unit, without a privilege, in the background of nothing
as_unit() { setpriv --reuid="$(unit User)" --regid="$(unit Group)" --init-groups --inh-caps=-all --no-new-privs -- "$@"; }

examples() {
    local examples=/usr/share/doc/libcallcontrol-dev/examples
    g++ -std=c++20 -Wall -Werror $examples/two_modules.cpp $(pkg-config --cflags --libs callcontrol) -o /root/two_modules
    /root/two_modules >/root/two_modules.out || fail "the example of two modules"
    cmake -S $examples/line -B /root/line >/dev/null
    cmake --build /root/line >/root/line.log || fail "the example of a line: $(cat /root/line.log)"
    ctest --test-dir /root/line >/root/line.log || fail "the example's tests: $(cat /root/line.log)"
    printf '#include "host/SignallingModule.h"\n#include "host/MetricText.h"\nint main() { return MetricText().get().size(); }\n' >/root/module.cpp
    g++ -std=c++20 /root/module.cpp $(pkg-config --cflags --libs callcontrol-gateway) -o /root/module && /root/module ||
        fail "what a gateway's module is built with"
}

gateway() {
    getent passwd callcontrol-gateway >/dev/null || fail "there is no user"
    [[ $(stat -c %F /etc/callcontrol-gateway) == directory ]] || fail "there is no folder for the configuration"
    local folder
    for folder in run lib log; do install -d -o callcontrol-gateway "/var/$folder/callcontrol-gateway"; done
    sed -e 's/192.0.2.1:5060/127.0.0.1:33400/; s/192.0.2.10:5060/127.0.0.1:33401/; s/10.0.0.1:5060/127.0.0.1:33402/' \
        -e 's/10.0.0.20:5060/127.0.0.1:33403/; s/127.0.0.1:9160/127.0.0.1:33404/' /usr/share/callcontrol-gateway/gateway.toml \
        >/etc/callcontrol-gateway/gateway.toml
    as_unit $(unit ExecStartPre) || fail "the example of a configuration"
    as_unit $(unit ExecStart) >/root/gateway.out 2>/root/gateway.log &
    local gateway=$!
    local i
    for ((i = 0; i < 200; i++)); do gatewayctl status >/root/status 2>&1 && break; sleep 0.05; done
    grep -q '^state *serving$' /root/status || fail "does not serve: $(cat /root/status /root/gateway.log)"
    expect_call
    for ((i = 0; i < 200; i++)); do [[ -s /var/log/callcontrol-gateway/calls.jsonl ]] && break; sleep 0.05; done
    grep -q '"cause":16' /var/log/callcontrol-gateway/calls.jsonl || fail "no record of the call"
    python3 -c 'import urllib.request as r; print(r.urlopen("http://127.0.0.1:33404/metrics").read().decode())' |
        grep -x 'callcontrol_gateway_calls_answered_total 1' >/dev/null || fail "the figures"
    gatewayctl shutdown
    wait $gateway || fail "the gateway's exit status $?: $(cat /root/gateway.log)"
    recorder calls /var/lib/callcontrol-gateway/calls.ring | grep -q 4989123 || fail "the recorder does not know the call"
    sed -i 's/^name = "office"/&\n\n[[isdn]]\nname = "line"/' /etc/callcontrol-gateway/gateway.toml
    callcontrol-gateway --config /etc/callcontrol-gateway/gateway.toml --check >/root/isdn.log 2>&1 && fail "a line without an address"
    grep -q 'isdn\[0\]\.' /root/isdn.log || fail "the module for ISDN: $(cat /root/isdn.log)"
}

inside() {
    cd /root
    dpkg -i ./*.deb >dpkg.log 2>&1 || fail "they cannot be installed: $(cat dpkg.log)"
    examples
    gateway
    dpkg -P $(for package in *.deb; do echo "${package%%_*}"; done) >dpkg.log 2>&1 || fail "they cannot be taken away: $(cat dpkg.log)"
    [[ ! -e /usr/bin/callcontrol-gateway && ! -e /usr/include/callcontrol ]] || fail "something is left"
    echo "passed"
}

# --- outside

# The copy is what is here, with a layer of memory above it, and without the sources.
outside() {
    local packages=$1 project
    project=$(realpath "$(dirname "$0")/../..")
    copy=$(mktemp -d)
    trap 'umount --recursive --lazy "$copy"; rmdir "$copy"' EXIT
    mount -t tmpfs tmpfs "$copy"
    mkdir -p "$copy"/{upper,work,root}
    mount -t overlay overlay -o "lowerdir=/,upperdir=$copy/upper,workdir=$copy/work" "$copy/root"
    mount -t tmpfs tmpfs "$copy/root/root"
    cp "$packages"/*.deb "$0" "$copy/root/root"
    mount -t tmpfs tmpfs "$copy/root$project"
    mount -t tmpfs tmpfs "$copy/root/run"
    mount -t proc proc "$copy/root/proc"
    mount --rbind /dev "$copy/root/dev"
    chroot "$copy/root" env -i PATH=/usr/sbin:/usr/bin:/sbin:/bin HOME=/root DEBIAN_FRONTEND=noninteractive \
        bash /root/packages.sh inside
}

# whether a machine has what the copy is made with
LAYERS='mount -t tmpfs tmpfs /mnt && mkdir /mnt/upper /mnt/work /mnt/root && ip link set lo up &&
    mount -t overlay overlay -o lowerdir=/,upperdir=/mnt/upper,workdir=/mnt/work /mnt/root'

case $1 in
inside) inside ;;
outside) outside "$2" ;;
*)
    [[ $(id -u) == 0 ]] || fail "to install packages, even in a copy, root is needed"
    unshare --mount --pid --fork --net bash -c "$LAYERS" 2>/dev/null ||
        { echo "NOT TRIED: this machine lets nobody lay one file system over another; the packages were made, and not installed"; exit 0; }
    exec unshare --mount --pid --fork --net --kill-child bash -c 'ip link set lo up; exec bash "$0" outside "$1"' "$0" "$1"
    ;;
esac

#!/bin/bash
# The services under a real systemd. scripts/try-packages runs it as root in a chroot of plain Debian 12 in which systemd
# is the first process and in which there is /packages and nothing else of this tree. Each step prints a line when it is
# done.
set -euo pipefail
export DEBIAN_FRONTEND=noninteractive LC_ALL=C.UTF-8 HOME=/root PATH=/usr/local/sbin:/usr/local/bin:/usr/sbin:/usr/bin:/sbin:/bin
cd /root

fail() {
    printf 'FAILED: %s\n' "$*" >&2
    systemctl --no-pager status 'lapdmon*' kv9relayd lapdship lapdstore >&2 || true
    exit 1
}
step() { printf '  %s\n' "$*"; }
# until_it WHAT COMMAND...: waits for at most a minute until the command succeeds.
until_it() {
    local what=$1
    shift
    for _ in $(seq 300); do
        "$@" >/dev/null 2>&1 && return
        sleep 0.2
    done
    fail "not in a minute: $what"
}
says() { journalctl -o cat -u "$1" --no-pager | grep -cF -- "$2" || true; }
is_stopped() { ! systemctl is-active --quiet "$1"; }
status_is() { systemctl show -p StatusText --value "$1" | grep -q "^$2"; }
restarted() { [ "$(systemctl show -p NRestarts --value "$1")" -ge "$2" ]; }
frames() { lapdread --quiet /var/log/lapdmon/"$1".*.pcapng* | wc -l; }
more_than() { [ "$(frames "$1")" -gt "$2" ]; }
more_come() { until_it "frames of $1 are recorded" more_than "$1" "$(frames "$1")"; }

rm -f /usr/sbin/policy-rc.d  # here services may be started and stopped
apt-get install -y /packages/*.deb >output 2>&1 || { cat output >&2; fail 'the installation'; }
grep -i 'syntax\|failed\|warning:' output && fail 'the installation complains'
for file in lapdmon kv9relayd; do
    echo LD_LIBRARY_PATH=/usr/lib/lapdmon >/etc/default/$file
done

systemctl enable --now lapdmon@1-1 2>/dev/null
systemctl is-active --quiet lapdmon-record@1-1 || fail 'the recorder is not ready when the trace starts'
until_it 'the trace runs' status_is lapdmon@1-1 'tracing board 1, D channel 1'
more_come 1-1
step 'a trace and its recorder'

for signal in TERM KILL; do
    restarts=$(systemctl show -p NRestarts --value lapdmon-record@1-1)
    if [ "$signal" = TERM ]; then
        systemctl restart lapdmon-record@1-1
        more_come 1-1
        lapdread check --quiet --jsonl /var/log/lapdmon/1-1.*.pcapng* >findings
        grep '"ns-gap' findings && fail 'a frame is lost when the recorder starts again'
    else
        systemctl kill --kill-whom=main -s KILL lapdmon-record@1-1
        until_it 'a killed recorder starts again' restarted lapdmon-record@1-1 $((restarts + 1))
    fi
    until_it 'the recorder is there' systemctl is-active --quiet lapdmon-record@1-1
    more_come 1-1
done
systemctl kill --kill-whom=main -s KILL lapdmon@1-1
until_it 'a killed trace starts again' restarted lapdmon@1-1 1
until_it 'the trace runs again' status_is lapdmon@1-1 'tracing'
more_come 1-1
step 'either starts again after its end'

echo REMOTE_NORV=127.0.0.1 >/etc/default/lapdmon-1-1
systemctl restart lapdmon@1-1
until_it 'the second attempt' status_is lapdmon@1-1 'no trace: .*after 2 s'
until_it 'the third attempt' status_is lapdmon@1-1 'no trace: .*after 4 s'
[ "$(says lapdmon@1-1 'trying again until the trace runs')" = 1 ] || fail 'the reason is not said once'
systemctl start kv9relayd
until_it 'a trace over the relay' status_is lapdmon@1-1 'tracing'
more_come 1-1
systemctl stop kv9relayd
until_it 'the trace without its relay' status_is lapdmon@1-1 'no trace'
systemctl start kv9relayd
until_it 'a trace over the relay again' status_is lapdmon@1-1 'tracing'
more_come 1-1
rm /etc/default/lapdmon-1-1
systemctl restart lapdmon@1-1
until_it 'a trace of the board in this machine' status_is lapdmon@1-1 'tracing'
step 'a relay that is away and comes back'

for unit in kv9relayd lapdmon-record@1-1; do
    mkdir -p "/etc/systemd/system/$unit.service.d"
    printf '[Service]\nWatchdogSec=2\nRestartSec=1\n' >"/etc/systemd/system/$unit.service.d/soon.conf"
    systemctl daemon-reload
    systemctl restart "$unit"
    restarts=$(systemctl show -p NRestarts --value "$unit")
    systemctl kill --kill-whom=main -s STOP "$unit"
    until_it "$unit, which hangs, starts again" restarted "$unit" $((restarts + 1))
    until_it "$unit is there" systemctl is-active --quiet "$unit"
done
more_come 1-1
step 'watchdogs'

for unit in lapdship lapdstore; do
    ! systemctl is-enabled --quiet $unit 2>/dev/null || fail "$unit is enabled by its installation"
    systemctl start $unit
    ! systemctl is-active --quiet $unit || fail "$unit runs without a configuration"
done
cat >/etc/lapdship.toml <<END
site = "here"
servers = ["nats://127.0.0.1:1"]
state = "/var/lib/lapdship"
metrics = "9470"
[[dchannel]]
board = "1"
dchannel = "1"
trunk = "1-1"
folder = "/var/log/lapdmon"
END
echo 'STORE_OPTIONS="--database postgresql://nobody@/lapd?host=/nowhere --nats nats://127.0.0.1:1 --metrics 9471"' >/etc/default/lapdstore
for unit in lapdship lapdstore; do
    systemctl start $unit
    systemctl is-active --quiet $unit || fail "$unit is not ready"
    until_it "$unit offers figures" eval "says $unit 'figures are at' | grep -q '^[1-9]'"
done
# It reads the recordings, as a member of the group lapdmon, though no server is there.
shipped() { exec 8<>/dev/tcp/127.0.0.1/9470; printf 'GET /metrics HTTP/1.0\r\n\r\n' >&8; cat <&8; }
ships() { shipped | grep '^lapdship_frames_total' | grep -qv ' 0$'; }
until_it 'the shipper reads what is recorded' ships
# What is old is forgotten every day while the store runs, once somebody has said how old.
systemctl is-active --quiet lapdstore-forget.timer || fail 'the timer does not run'
systemctl start lapdstore-forget
[ "$(systemctl show -p ConditionResult --value lapdstore-forget)" = no ] || fail 'it forgets without a configuration'
echo 'FORGET_OPTIONS="--database postgresql://nobody@/lapd?host=/nowhere --days 90"' >/etc/default/lapdstore-forget
! systemctl start lapdstore-forget 2>/dev/null || fail 'it forgets without a database'
[ "$(systemctl show -p ExecMainStatus --value lapdstore-forget)" = 2 ] || fail 'it ends with another status'
systemctl stop lapdship lapdstore lapdstore-forget
until_it 'the timer ends with the store' is_stopped lapdstore-forget.timer
[ "$(systemctl show -p Result --value lapdship lapdstore | sort -u | tr -d '\n')" = success ] || fail 'the end of the fleet programs'
step 'the fleet, which needs a configuration and ends in order'

traces=$(systemctl show -p MainPID --value lapdmon@1-1 lapdmon-record@1-1)
apt-get install -y --reinstall /packages/*.deb >output 2>&1 || { cat output >&2; fail 'the upgrade'; }
[ "$(systemctl show -p MainPID --value lapdmon@1-1 lapdmon-record@1-1)" = "$traces" ] || fail 'an upgrade ends traces'
more_come 1-1
apt-get remove -y lapdmon lapdmon-fleet lapdread softboard lapdmon-doc libvela-dev >output 2>&1 || { cat output >&2; fail 'the removal'; }
left=$(systemctl list-units --no-legend --plain 'lapdmon*' 'kv9relayd*' --state=active)
[ -z "$left" ] || fail "after the removal still runs: $left"
grep -hE '^(lapdmon|lapdread|kv9relayd|lapdship|lapdstore)' /proc/[0-9]*/comm && fail 'after the removal programs still run'
[ -z "$(ls /var/log/lapdmon/*.part 2>/dev/null)" ] || fail 'the removal did not let the recorders finish their files'
[ -n "$(ls /var/log/lapdmon/*.pcapng)" ] || fail 'the removal takes evidence'
dpkg --purge lapdmon lapdmon-fleet lapdread softboard lapdmon-doc libvela-dev >output 2>&1 || { cat output >&2; fail 'the purge'; }
[ ! -e /var/log/lapdmon ] && [ ! -e /etc/default/lapdmon ] || fail 'the purge leaves something'
step 'an upgrade leaves traces alone, a removal ends them'

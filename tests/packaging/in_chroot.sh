#!/bin/bash
# What somebody does with the packages on a plain Debian 12. scripts/try-packages runs it as root in a chroot that has
# nothing of this tree but /packages, /older and /readme-commands. Each step prints a line when it is done.
set -euo pipefail
export DEBIAN_FRONTEND=noninteractive LC_ALL=C.UTF-8 MANPAGER=cat HOME=/root
cd /root

fail() {
    printf 'FAILED: %s\n' "$*" >&2
    exit 1
}
step() { printf '  %s\n' "$*"; }
quietly() { "$@" >/tmp/output 2>&1 || { cat /tmp/output >&2; fail "$*"; }; }
ours=(lapdmon lapdmon-doc lapdmon-fleet lapdread softboard libvela-dev)

# Every file and folder but those that tools keep for themselves.
files() {
    find / -xdev \( -path /proc -o -path /sys -o -path /dev -o -path /run -o -path /tmp -o -path /root -o -path /packages \
        -o -path /older -o -path /var/lib/dpkg -o -path /var/lib/apt -o -path /var/cache -o -path /var/log/apt \) -prune \
        -o -print | grep -vE '^/(var/log/(dpkg|alternatives)\.log|etc/(passwd|group|shadow|gshadow|sub.id)-?|etc/ld\.so\.cache|etc/\.pwd\.lock)$' | sort
}

echo force-unsafe-io >/etc/dpkg/dpkg.cfg.d/quick  # the chroot is thrown away
quietly apt-get update
quietly bash -euc "$(cat /readme-commands)"
grep -q 'lapdmon: there is no libnorv.so' /tmp/output || fail 'the installation does not say that libnorv.so is missing'
version=$(dpkg-query -W -f '${Version}' lapdmon)
step "installed by the README's commands: $version"

status=0
lapdmon -b1 >/tmp/output 2>&1 || status=$?
[ "$status" -eq 127 ] && grep -q 'libnorv.so: cannot open shared object file' /tmp/output || fail "lapdmon without a library"
step 'without a board only the loader speaks'

# The pause gives the trace time for a call; what is checked is what the log then has.
mkfifo keys
softboard --rate max -- lapdmon -b1 <keys >screen 2>&1 &
exec 3>keys
for _ in $(seq 300); do
    grep -qa 'RELEASE COMPLETE(0x5a)' lapdmon.log 2>/dev/null && break
    sleep 0.1
done
printf q >&3
wait $!
exec 3>&-
grep -q 'NET5 Switch' screen || fail 'the demo has no screen'
lapdread lapdmon.log | grep -q 'SETUP' || fail 'lapdread lists no SETUP'
lapdread calls lapdmon.log | grep -q 'cause\|normal' || fail 'lapdread shows no call'
lapdread convert lapdmon.log /tmp/day.pcapng && lapdread /tmp/day.pcapng | grep -q SETUP || fail 'lapdread convert'
softboard --frames /usr/share/doc/softboard/examples/ni2.pcap --protocol ni2 --rate max -- lapdmon -b1 -f ni2.log \
    < <(sleep 2; printf q) | grep -q 'NI2 Switch' || fail 'the example is not traced'
step 'a trace on the software board, read by lapdread'

for page in $(dpkg -L lapdmon lapdmon-fleet lapdread softboard | sed -n 's#^/usr/share/man/man./\(.*\)\.gz$#\1#p'); do
    name=${page%.*} section=${page##*.}
    man --warnings "$section" "$name" >/tmp/output 2>/tmp/warnings || fail "man $section $name"
    [ ! -s /tmp/warnings ] && grep -q '^NAME' /tmp/output || fail "man $section $name: $(cat /tmp/warnings)"
done
step "manual pages"

bash -ic 'source /usr/share/bash-completion/bash_completion; _completion_loader lapdread
    COMP_WORDS=(lapdread record --fold) COMP_CWORD=2; _lapdread; [ "${COMPREPLY[*]}" = --folder ]' 2>/dev/null ||
    fail 'bash does not complete lapdread'
for program in lapdmon lapdread softboard kv9relayd lapdship lapdstore; do
    zsh -fc "autoload -Uz compinit; compinit -u -D; [[ \$_comps[$program] == _$program ]]" || fail "zsh: $program"
    bash -ic "source /usr/share/bash-completion/bash_completion; _completion_loader $program; complete -p $program" \
        >/dev/null 2>&1 || fail "bash: $program"
done
step 'completion in bash and zsh'

getent passwd lapdmon >/dev/null || fail 'there is no user lapdmon'
for unit in lapdmon@.service lapdmon@.socket lapdmon-record@.service kv9relayd.service lapdship.service lapdstore.service \
            lapdstore-forget.service lapdstore-forget.timer; do
    told=$(systemd-analyze verify --man=no "/lib/systemd/system/$unit" 2>&1) && [ -z "$told" ] || fail "$unit: $told"
done
# Each unit's ExecStart as its user, with the FIFO as the socket unit makes it and holds it open.
command_of() { sed -n 's/^ExecStart=//p' "/lib/systemd/system/$1" | sed 's/%i/1-1/g'; }
export LD_LIBRARY_PATH=/usr/lib/lapdmon RECORD_LIMITS='--size 100M --files 5' RELAY_OPTIONS='--listen 127.0.0.1:0'
install -d -o lapdmon -g lapdmon -m 750 /var/log/lapdmon
install -d /run/lapdmon
mkfifo -m 600 /run/lapdmon/1-1.fifo
chown lapdmon:lapdmon /run/lapdmon/1-1.fifo
exec 9<>/run/lapdmon/1-1.fifo
setpriv --reuid lapdmon --regid lapdmon --init-groups bash -c "exec $(command_of lapdmon-record@.service)" 9<&- &
recorder=$!
setpriv --reuid lapdmon --regid lapdmon --init-groups bash -c "exec $(command_of lapdmon@.service)" 9<&- >screen 2>&1 &
trace=$!
for _ in $(seq 300); do
    lapdread --quiet /var/log/lapdmon/*.part 2>/dev/null | grep -q 'RELEASE COMPLETE' && break
    sleep 0.1
done
kill -TERM "$trace"
wait "$trace" || fail "the trace's service ends with $?: $(cat screen)"
kill -TERM "$recorder"
wait "$recorder" || fail "the recorder's service ends with $?"
exec 9<&-
lapdread /var/log/lapdmon/1-1.*.pcapng | grep -q SETUP || fail "the services recorded nothing: $(ls /var/log/lapdmon)"
setpriv --reuid lapdmon --regid lapdmon --init-groups bash -c "exec $(command_of kv9relayd.service)" >relay 2>&1 &
relay=$!
for _ in $(seq 300); do
    grep -qs 'listening on' relay && break
    sleep 0.1
done
kill -TERM "$relay"
wait "$relay" || fail "the relay's service ends with $?: $(cat relay)"
unset LD_LIBRARY_PATH RECORD_LIMITS RELAY_OPTIONS
step "the services' programs, as their user"

for user in lapdship lapdstore; do
    getent passwd "$user" >/dev/null || fail "there is no user $user"
done
id -nG lapdship | grep -qw lapdmon || fail 'lapdship may not read what the services record'
for program in lapdship lapdstore; do
    [ "$($program --version)" = "$program ${version%-*}" ] || fail "$program --version: $($program --version)"
done
examples=/usr/share/doc/lapdmon-fleet/examples
for file in lapdship.toml lapdstore.default lapdstore-forget.default alerts.yml prometheus.yml alertmanager.yml fleet-certificates; do
    [ -s $examples/$file ] || fail "there is no example $file"
done
# The example as it stands: it names servers and certificates that are not here.
install -d -o lapdship -m 700 /var/lib/lapdship
sed 's#"/etc/lapdship/#"/nowhere/#' $examples/lapdship.toml >/etc/lapdship.toml
timeout 20 setpriv --reuid lapdship --regid lapdship --init-groups bash -c "exec $(command_of lapdship.service)" >shipper 2>&1 || true
grep -q 'figures are at http://127.0.0.1:9470/metrics' shipper || fail "lapdship: $(cat shipper)"
grep -qi 'certificate\|tls\|file' shipper || fail "lapdship does not say what it lacks: $(cat shipper)"
rm -rf /etc/lapdship.toml /var/lib/lapdship
status=0
STORE_OPTIONS='--database postgresql://nobody@/lapd?host=/nowhere' \
    setpriv --reuid lapdstore --regid lapdstore --init-groups bash -c "exec $(command_of lapdstore.service) migrate" >store 2>&1 || status=$?
[ "$status" -eq 2 ] && grep -q '^lapdstore: ' store || fail "lapdstore ends with $status: $(cat store)"
status=0
FORGET_OPTIONS='--database postgresql://nobody@/lapd?host=/nowhere --days 90' \
    setpriv --reuid lapdstore --regid lapdstore --init-groups bash -c "exec $(command_of lapdstore-forget.service)" >store 2>&1 || status=$?
[ "$status" -eq 2 ] && grep -q '^lapdstore: ' store || fail "lapdstore forget ends with $status: $(cat store)"
# No database runs here, but the module is found, and what it links with is installed.
said=$(lapdread --store postgresql://127.0.0.1:1/lapd 2>&1 || true)
grep -q 'the store: connection' <<<"$said" || fail "lapdread --store: $said"
step 'the fleet: programs, users, examples'

quietly apt-get purge -y "${ours[@]}"
files >/tmp/before
quietly apt-get install -y /older/*.deb
older=$(dpkg-query -W -f '${Version}' lapdmon)
dpkg --compare-versions "$older" lt "$version" || fail "$older is no lower version than $version"
install -d -o lapdmon /var/log/lapdmon
echo evidence >/var/log/lapdmon/kept
quietly apt-get install -y /packages/*.deb
grep -q 'there is no libnorv.so' /tmp/output && fail 'an upgrade says again that libnorv.so is missing'
[ "$(dpkg-query -W -f '${Version}' lapdmon)" = "$version" ] || fail 'the upgrade'
lapdread --version >/dev/null && softboard -- lapdmon -h | grep -q 'syntax: lapdmon' || fail 'after the upgrade'
step "upgraded from $older"

quietly apt-get remove -y "${ours[@]}"
left=$(files | comm -13 /tmp/before - | tr '\n' ' ')
[ "$left" = '/var/log/lapdmon /var/log/lapdmon/kept ' ] || fail "removal leaves: $left"
quietly dpkg --purge "${ours[@]}"
left=$(files | comm -13 /tmp/before - | tr '\n' ' ')
[ -z "$left" ] || fail "purge leaves: $left"
for user in lapdmon lapdship lapdstore; do
    getent passwd "$user" >/dev/null && fail "purge leaves the user $user"
done
step 'removal left the records and nothing else, purge nothing'

"""What the cases of the installed agent in real user sessions share: how they are declared, and the session of each.

A script of cases declares them with `case` and ends in `main(__file__)`; its command line is

       SCRIPT --list
       SCRIPT CASE STAGE TIMER

Each case runs in a throw-away session of its own (see with-user-session), for an unprivileged user. STAGE is a folder
with the installed files, TIMER the name of the agent's timer. Exit status 77: no session can be made here.

The timer tries every second instead of every four hours, and the conditions that depend on how busy this machine is are
left out; both by drop-ins, as an administrator would do it. All else is as it is shipped.
"""

import os
import pathlib
import sys

import session as lib
from session import HOME, PREFERENCES

HERE = pathlib.Path(__file__).resolve().parent
VOLUME = "/media/volume"

BOTH = ["com.brixo.norvex.run2", "com.brixo.norvex.filecounts.run3"]
ALL_THREE = BOTH + ["com.brixo.norvex.directoryinfo.run4"]

INTERNAL = "install -D -m 644 /dev/null /etc/norvex/internal-install"
LARGE_HOME = "mount -t tmpfs -o nr_inodes=0,mode=700,uid=4242,gid=4242 tmpfs /home/tester"
SLOW_TIMER = 'rm "/etc/systemd/user/$timer.d/every-second.conf"'

# The package's: another one may be in a folder that the session's user cannot reach.
PYTHON = "/usr/bin/python3"

cases = {}


def case(setup=":"):
    """Declares a case; `setup` is shell code that root runs before the session begins."""
    def declare(test):
        cases[test.__name__] = (test, setup)
        return test
    return declare


def stored(value):
    """Setup with this value in the preferences."""
    file = f"$HOME/{PREFERENCES.relative_to(HOME)}"
    return (f"mkdir -p $HOME/.config/norvex; echo '{{\"LastVersionRun\": {value}}}' >{file}; "
            "chown -R 4242:4242 $HOME/.config")


SETUP = r"""
set -e
stage=$1 timer=$2 service=com.brixo.NorvexAgent.service
cp -a "$stage"/. /
systemctl --quiet --global preset "$timer"
mount -t tmpfs tmpfs /var/lib/systemd/catalog
journalctl --update-catalog

mkdir -p /media/volume
mount -t tmpfs -o mode=755,uid=4242,gid=4242,nr_inodes=0 tmpfs /media/volume
mkdir -p /media/volume/Music /media/volume/Pictures
for item in Music/song.mp3 Pictures/lake.jpg Pictures/hill.png letter.pdf; do
    head -c 5000 /dev/zero >"/media/volume/$item"
done
sed -i 's#^IncludedVolumes=.*#IncludedVolumes=/media/volume#' /etc/chronel/backup.conf

mkdir -p "/etc/systemd/user/$timer.d" "/etc/systemd/user/$service.d" /run/session-test
printf '[Timer]\nOnActiveSec=\nOnCalendar=\nOnCalendar=*-*-* *:*:*\nAccuracySec=50ms\nRandomizedDelaySec=0\n' \
    >/run/session-test/every-second.conf
ln -s /run/session-test/every-second.conf "/etc/systemd/user/$timer.d/"
{
    echo '[Unit]'
    echo 'StartLimitIntervalSec=0'
    echo 'ConditionEnvironment='
    grep '^Condition' "/usr/lib/systemd/user/$service" | grep -vE 'Pressure|ACPower'
    echo '[Service]'
    echo 'CPUSchedulingPolicy=other'
    echo 'Nice=0'
    # The manager forgets how a process ended as soon as nobody needs its unit.
    echo 'ExecStopPost=/bin/echo ended: ${EXIT_CODE} ${EXIT_STATUS} ${SERVICE_RESULT}'
} >"/etc/systemd/user/$service.d/test.conf"

install -m 644 -D -t /run/session-test "${@:3}"
"""


def run_in_session(script, name, stage, timer):
    _, setup = cases[name]
    files = " ".join(f"'{file}'" for file in (HERE / "session.py", HERE / "agent_session.py", script))
    # A function, so that what the case's own part says stands last and has the same variables.
    shell = f"prepare() {{\n{SETUP}\n}}\nprepare '{stage}' '{timer}' {files}\n{setup}"
    harness = HERE.parent / "with-user-session"
    os.chdir("/")
    os.execv(harness, [str(harness), "-s", shell, "env", f"NORVEX_TIMER={timer}", "PYTHONDONTWRITEBYTECODE=1",
                       PYTHON, f"/run/session-test/{script.name}", "--inside", name])


def main(script):
    if sys.argv[1:] == ["--list"]:
        print("\n".join(f"{lib.claim_of(name)}={name}" for name in cases))
    elif sys.argv[1] == "--inside":
        lib.run_inside(cases[sys.argv[2]][0])
    else:
        run_in_session(pathlib.Path(script).resolve(), *sys.argv[1:])

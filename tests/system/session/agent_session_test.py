#!/usr/bin/env python3
"""The installed agent in a real user session: its timer starts it, it reports into the journal, and switches itself off.

usage: agent_session_test.py --list
       agent_session_test.py CASE STAGE TIMER

Each case runs in a throw-away session of its own (see with-user-session), for an unprivileged user. STAGE is a folder
with the installed files, TIMER the name of the agent's timer. Exit status 77: no session can be made here.

The timer tries every second instead of every four hours, and the conditions that depend on how busy this machine is are
left out; both by drop-ins, as an administrator would do it. All else is as it is shipped.
"""

import json
import os
import pathlib
import signal
import subprocess
import sys
import time

import session as lib
from session import HOME, MESSAGES_FILE, PREFERENCES, SERVICE, TIMER, systemctl

HERE = pathlib.Path(__file__).resolve().parent
VOLUME = "/media/volume"

BOTH = ["com.brixo.norvex.run2", "com.brixo.norvex.filecounts.run3"]
ALL_THREE = BOTH + ["com.brixo.norvex.directoryinfo.run4"]

INTERNAL = "install -D -m 644 /dev/null /etc/norvex/internal-install"
LARGE_HOME = "mount -t tmpfs -o nr_inodes=0,mode=700,uid=4242,gid=4242 tmpfs /home/tester"
SLOW_TIMER = 'rm "/etc/systemd/user/$timer.d/every-second.conf"'
PRESSURE = "/run/pressure"

# The package's: another one may be in a folder that the session's user cannot reach.
PYTHON = "/usr/bin/python3"

MEMORY_LIMIT = 1_048_576_000

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


# Reporting.


@case()
def reports_two_messages_and_switches_itself_off(s):
    s.wait_for_runs()
    assert sorted(s.domains()) == sorted(BOTH), s.domains()
    assert s.last_version_run() == 4
    assert s.exit_of_agent() == "exited 0 success"
    s.assert_switched_off()
    assert not MESSAGES_FILE.exists()


@case(INTERNAL)
def internal_installation_reports_three_messages(s):
    s.wait_for_runs()
    assert sorted(s.domains()) == sorted(ALL_THREE), s.domains()
    assert s.last_version_run() == 4
    s.assert_switched_off()


@case()
def a_report_carries_its_pairs_and_names_its_unit(s):
    s.wait_for_runs()
    reports = sorted(s.reports(), key=lambda entry: entry["NORVEX_DOMAIN"])
    assert len(reports) == 2, s.domains()
    for entry, pairs in zip(reports, (6, 66)):
        numbered = [key for key in entry if key.startswith("NORVEX_PAIR_")]
        assert len(numbered) == pairs, numbered
        assert entry["PRIORITY"] == "5" and entry["SYSLOG_IDENTIFIER"] == "NorvexAgent"
        assert lib.of_service(entry)
        # The catalog knows what it is.
        explained = lib.run("journalctl", "-x", "-o", "short", f"MESSAGE_ID={entry['MESSAGE_ID']}")
        assert "NorvexAgent(8)" in explained, explained


@case(stored(3))
def an_older_releases_report_does_not_count(s):
    s.wait_for_runs()
    assert sorted(s.domains()) == sorted(BOTH), s.domains()
    assert s.last_version_run() == 4


# Staying off.


@case()
def stays_off_after_the_next_login_until_it_is_switched_on(s):
    s.wait_for_runs()
    s.assert_switched_off()
    s.assert_does_not_start_again()
    s.log_out_and_in()
    assert s.timer_state() == ("masked", "inactive"), s.timer_state()
    s.assert_does_not_start_again()
    s.switch_on()
    s.wait_for_runs(2)
    # This release has reported: it only switches itself off again.
    s.assert_switched_off()
    assert len(s.reports()) == 2


@case(stored(4))
def having_reported_it_only_switches_itself_off(s):
    s.wait_for_runs()
    s.assert_switched_off()
    assert s.exit_of_agent() == "exited 0 success"
    assert s.reports() == []


@case(stored(5))
def a_later_releases_report_counts(s):
    s.wait_for_runs()
    s.assert_switched_off()
    assert s.reports() == []
    assert s.last_version_run() == 5


@case(SLOW_TIMER)
def as_shipped_the_next_attempt_is_never_far(s):
    """Both turns are up to a random hour late, and up to a minute inexact; a missed one is made up for."""
    s.assert_switched_on()
    [timer] = (row for row in json.loads(systemctl("list-timers", "--output=json")) if row["unit"] == TIMER)
    minutes_after_login = (timer["next"] / 1e6 - time.time()) / 60
    assert minutes_after_login < 77, timer  # earlier where a regular turn comes first
    next_regular = int(lib.run("date", "-d", systemctl("show", "-P", "NextElapseUSecRealtime", TIMER), "+%s"))
    assert 0 <= next_regular - time.time() < 5 * 3600 + 120, next_regular
    assert systemctl("show", "-P", "Persistent", TIMER) == "yes"


@case("mkdir -p $HOME/.config/systemd/user; chown -R 4242:4242 $HOME/.config; chmod 500 $HOME/.config/systemd/user")
def a_job_that_cannot_be_switched_off_is_tried_the_next_time(s):
    s.wait_for_runs(2)
    failures = [line for line in s.agent_lines() if line.startswith("Failed to disable com.brixo.NorvexAgent, error: ")]
    assert len(failures) >= 2, s.agent_lines()
    assert s.exit_of_agent() == "exited 0 success"
    assert len(s.reports()) == 2 and s.last_version_run() == 4
    (HOME / ".config/systemd/user").chmod(0o700)
    s.assert_switched_off()


# By hand.


@case(SLOW_TIMER)
def force_reports_again_and_leaves_the_timer_on(s):
    lib.run("norvexctl", "index", "update")
    for reported in (2, 4):
        assert subprocess.run([lib.AGENT, "--force"], timeout=lib.LIMIT_S).returncode == 0
        s.journal.wait(lib.is_report, "the report", reported)
        assert s.last_version_run() == 4
        s.assert_switched_on()


@case(SLOW_TIMER)
def by_hand_it_waits_for_the_signal_to_run(s):
    lib.run("norvexctl", "index", "update")
    with subprocess.Popen([lib.AGENT]) as agent:
        waits = pathlib.Path(f"/proc/{agent.pid}/task")
        lib.eventually(lambda: [(thread / "wchan").read_text() for thread in waits.iterdir()].count("0") == 0
                       and len(list(waits.iterdir())) > 1, "the agent waits in all its threads")
        assert agent.poll() is None and s.reports() == [] and not PREFERENCES.exists()
        agent.send_signal(signal.SIGUSR1)
        assert agent.wait(lib.LIMIT_S) == 0
    s.journal.wait(lib.is_report, "the report", 2)
    s.assert_switched_off()


# Nothing to report, and not wanted.


@case(SLOW_TIMER)
def without_a_checked_index_it_is_tried_again(s):
    lib.fill_folder(pathlib.Path(VOLUME, "Many"), 300_000)
    interrupt_first_index_update()
    stores = HOME / ".cache/norvex/index"
    stores.chmod(0o500)  # so that the service cannot bring the index up to date either
    s.try_every_second()
    s.wait_for_runs(2)
    assert s.exit_of_agent() == "exited 0 success"
    assert s.reports() == [] and s.last_version_run() is None
    s.assert_switched_on()
    stores.chmod(0o700)
    s.journal.wait(lib.is_report, "the report", 2)


def interrupt_first_index_update():
    """Kills it when the store has been announced, and before it has been checked."""
    store = HOME / f".cache/norvex/index/{VOLUME.replace('/', '%2F')}.sqlite"
    update = subprocess.Popen(["norvexctl", "index", "update"])
    lib.eventually(store.exists, "the store has been announced")
    update.kill()
    assert update.wait() == -signal.SIGKILL


@case("mkdir -p $HOME/.config/environment.d; "
      "echo DO_NOT_TRACK=1 >$HOME/.config/environment.d/no-report.conf; chown -R 4242:4242 $HOME/.config")
def do_not_track_keeps_it_from_running(s):
    s.wait_for_skips("ConditionEnvironment=!DO_NOT_TRACK", 2)
    assert s.starts() == 0 and s.reports() == []
    s.assert_switched_on()
    (HOME / ".config/environment.d/no-report.conf").unlink()
    s.log_out_and_in()
    s.wait_for_runs()
    assert len(s.reports()) == 2


@case("install -D -m 666 /dev/null /etc/norvex/disabled; chown 4242 /etc/norvex /etc/norvex/disabled")
def a_disabled_machine_runs_it_for_nobody(s):
    s.wait_for_skips("ConditionPathExists=!/etc/norvex/disabled", 2)
    assert s.starts() == 0 and s.reports() == []
    os.unlink("/etc/norvex/disabled")
    s.wait_for_runs()
    assert len(s.reports()) == 2


# Being ended.


@case(LARGE_HOME + "; " + SLOW_TIMER)
def ended_while_measuring_it_has_written_nothing(s):
    lib.fill_folder(HOME / "Downloads", 300_000)
    systemctl("start", "--no-block", SERVICE)
    process = s.agent_process()
    lib.wait_until_larger(process, 30_000_000)
    systemctl("stop", SERVICE)
    assert s.exit_of_agent() == "killed TERM success", s.exit_of_agent()
    assert s.reports() == [] and not PREFERENCES.exists()
    s.assert_switched_on()


@case(LARGE_HOME + "; " + SLOW_TIMER)
def ended_while_reporting_it_finishes_the_report(s):
    lib.fill_folder(HOME / "Downloads", 300_000)
    systemctl("start", "--no-block", SERVICE)
    process = s.agent_process()
    lib.wait_until_larger(process, 30_000_000)
    # Behind its messages the agent waits for the manager, which is to switch the job off: so it is there to be ended.
    with lib.held(lib.parent_of(process)):
        s.journal.wait(lib.is_report, "the first message")
        os.kill(process, signal.SIGTERM)
    s.wait_for_runs()
    assert s.exit_of_agent() == "exited 0 success", s.exit_of_agent()
    assert sorted(s.domains()) == sorted(BOTH), s.domains()
    assert s.last_version_run() == 4
    s.assert_switched_off()


# A double of the file on which newer service managers tell that memory is short.
PRESSURE_FILE = (f"mkfifo {PRESSURE}; chown 4242 {PRESSURE}; "
                 f'echo Environment=MEMORY_PRESSURE_WATCH={PRESSURE} >>"/etc/systemd/user/$service.d/test.conf"')


@case(f"{LARGE_HOME}; {SLOW_TIMER}; {PRESSURE_FILE}")
def below_its_limit_it_goes_on_when_memory_is_short(s):
    lib.fill_folder(HOME / "Downloads", 300_000)
    systemctl("start", "--no-block", SERVICE)
    pressure = os.open(PRESSURE, os.O_RDWR | os.O_NONBLOCK)
    process = s.agent_process()
    lib.wait_until_larger(process, 30_000_000)
    os.write(pressure, b"x")
    s.wait_for_runs()
    try:
        assert os.read(pressure, 1) == b"", "the agent did not see that memory is short"
    except BlockingIOError:
        pass  # nothing is left: the agent has taken it
    assert sorted(s.domains()) == sorted(BOTH), s.domains()
    assert s.last_version_run() == 4


@case(f"{LARGE_HOME}; {SLOW_TIMER}; {PRESSURE_FILE}")
def above_its_limit_when_memory_is_short_it_gives_up(s):
    lib.fill_folder(HOME / "Downloads", 2_000_000)
    systemctl("start", "--no-block", SERVICE)
    process = s.agent_process()
    lib.wait_until_larger(process, MEMORY_LIMIT)
    with open(PRESSURE, "wb", buffering=0) as pressure:
        pressure.write(b"x")
        s.wait_for_runs()
    assert "Norvex Memory Watchdog: Critical memory pressure detected. Exiting." in s.agent_lines(), s.agent_lines()
    assert s.exit_of_agent() == "exited 0 success"
    assert s.reports() == [] and not PREFERENCES.exists()
    s.assert_switched_off()


# The sandbox.


@case(SLOW_TIMER)
def the_strict_sandbox_changes_no_figure(s):
    systemctl("start", SERVICE)
    systemctl("unmask", TIMER)
    PREFERENCES.unlink()
    switch_strict_sandbox_on()
    systemctl("start", SERVICE)
    entries = s.journal.wait(lib.is_report, "both reports", 4)
    for domain in BOTH:
        plain, strict = ({key: value for key, value in entry.items() if key.startswith("NORVEX_PAIR_")}
                         for entry in entries if entry["NORVEX_DOMAIN"] == domain)
        assert plain == strict, set(plain.items()) ^ set(strict.items())
    assert s.last_version_run() == 4
    assert systemctl("is-enabled", TIMER, check=False) == "masked"


@case(SLOW_TIMER)
def the_strict_sandbox_hides_nothing_from_the_index(s):
    """Of a volume that the sandbox divides: it makes mounts of the home folder's own, and of three folders in it."""
    del s
    mine = HOME / ".config/chronel/backup.conf"
    mine.parent.mkdir(parents=True)
    mine.write_text("[Backup]\nIncludedVolumes=/home\n")
    switch_strict_sandbox_on()
    systemctl("start", SERVICE)
    systemctl("start", SERVICE)  # now with all that the first run has left
    indexed = items_in_index()
    lib.run("norvexctl", "index", "update")
    assert items_in_index() == indexed > 10


def switch_strict_sandbox_on():
    drop_in = HOME / f".config/systemd/user/{SERVICE}.d/strict.conf"
    drop_in.parent.mkdir(parents=True)
    drop_in.symlink_to("/usr/share/norvex/strict.conf")
    systemctl("daemon-reload")
    assert systemctl("show", "-P", "PrivateUsers", SERVICE) == "yes"


def items_in_index():
    [volume] = json.loads(lib.run("norvexctl", "index", "status", "--json"))["volumes"]
    return volume["items"]


@case(SLOW_TIMER)
def the_service_is_as_closed_as_it_can_be(s):
    """By the service manager's own measure, from 0 (closed) to 100."""
    del s
    unit = pathlib.Path("/usr/lib/systemd/user", SERVICE)
    for strict, most_exposed in ((False, 55), (True, 10)):
        if strict:
            switch_strict_sandbox_on()
        systemd_analyze("security", "--offline=true", f"--threshold={most_exposed}", str(unit))


@case(SLOW_TIMER)
def the_units_have_no_line_that_the_manager_does_not_know(s):
    del s
    complaints = systemd_analyze("verify", "--man=no", *map(str, pathlib.Path("/usr/lib/systemd/user").glob("com.brixo.*")))
    assert complaints == "", complaints


def systemd_analyze(*arguments):
    """What it has to say about the units."""
    done = subprocess.run(["systemd-analyze", "--user", "--no-pager", *arguments], capture_output=True, text=True,
                          timeout=lib.LIMIT_S)
    assert done.returncode == 0, done.stdout[-300:] + done.stderr
    return done.stderr


# Around a case.


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
    # The manager forgets how a process ended as soon as nobody needs its unit.
    echo 'ExecStopPost=/bin/echo ended: ${EXIT_CODE} ${EXIT_STATUS} ${SERVICE_RESULT}'
} >"/etc/systemd/user/$service.d/test.conf"

install -m 644 -D -t /run/session-test "$3"/session.py "$3"/agent_session_test.py
"""


def run_in_session(name, stage, timer):
    _, setup = cases[name]
    # A function, so that what the case's own part says stands last and has the same variables.
    shell = f"prepare() {{\n{SETUP}\n}}\nprepare '{stage}' '{timer}' '{HERE}'\n{setup}"
    harness = HERE.parent / "with-user-session"
    os.chdir("/")
    os.execv(harness, [str(harness), "-s", shell, "env", f"NORVEX_TIMER={timer}", "PYTHONDONTWRITEBYTECODE=1",
                       PYTHON, "/run/session-test/agent_session_test.py", "--inside", name])


def main():
    if sys.argv[1:] == ["--list"]:
        print("\n".join(f"{lib.claim_of(name)}={name}" for name in cases))
    elif sys.argv[1] == "--inside":
        lib.run_inside(cases[sys.argv[2]][0])
    else:
        run_in_session(*sys.argv[1:])


if __name__ == "__main__":
    main()

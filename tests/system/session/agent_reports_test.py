#!/usr/bin/env python3
"""What the installed agent reports in a real user session, and when: started by its timer, and by hand.

usage: see agent_session.py
"""

import pathlib
import signal
import subprocess

import session as lib
from agent_session import ALL_THREE, BOTH, INTERNAL, SLOW_TIMER, VOLUME, case, main, stored
from session import HOME, MESSAGES_FILE, PREFERENCES


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
        try:
            waits = pathlib.Path(f"/proc/{agent.pid}/task")
            lib.eventually(lambda: [(thread / "wchan").read_text() for thread in waits.iterdir()].count("0") == 0
                           and len(list(waits.iterdir())) > 1, "the agent waits in all its threads")
            assert agent.poll() is None and s.reports() == [] and not PREFERENCES.exists()
            agent.send_signal(signal.SIGUSR1)
            assert agent.wait(lib.LIMIT_S) == 0
        finally:
            agent.kill()  # one that still waits would be waited for without end
    s.journal.wait(lib.is_report, "the report", 2)
    s.assert_switched_off()


# Nothing to report.


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


if __name__ == "__main__":
    main(__file__)

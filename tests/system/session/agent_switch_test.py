#!/usr/bin/env python3
"""How the installed agent is switched off in a real user session: by itself, by its user, by the administrator.

usage: see agent_session.py
"""

import json
import os
import time

import session as lib
from agent_session import SLOW_TIMER, case, main, stored
from session import HOME, TIMER, systemctl


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
    s.wait_for_agent_line(lambda line: line.startswith("Failed to disable com.brixo.NorvexAgent, error: "), 2)
    assert s.exit_of_agent() == "exited 0 success"
    assert len(s.reports()) == 2 and s.last_version_run() == 4
    (HOME / ".config/systemd/user").chmod(0o700)
    s.assert_switched_off()


# Not wanted.


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


if __name__ == "__main__":
    main(__file__)

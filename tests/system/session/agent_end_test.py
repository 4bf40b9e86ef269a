#!/usr/bin/env python3
"""How the installed agent ends in a real user session before it is done: when it is told to, when memory is short.

usage: see agent_session.py
"""

import os
import signal

import session as lib
from agent_session import BOTH, LARGE_HOME, SLOW_TIMER, case, main
from session import HOME, PREFERENCES, SERVICE, systemctl

PRESSURE = "/run/pressure"

MEMORY_LIMIT = 1_048_576_000

# A double of the file on which newer service managers tell that memory is short.
PRESSURE_FILE = (f"mkfifo {PRESSURE}; chown 4242 {PRESSURE}; "
                 f'echo Environment=MEMORY_PRESSURE_WATCH={PRESSURE} >>"/etc/systemd/user/$service.d/test.conf"')


def agent_that_measures(s, entries=300_000, size=30_000_000):
    """The process of an agent in the middle of a folder of so many entries, which has grown beyond the size in bytes."""
    lib.fill_folder(HOME / "Downloads", entries)
    systemctl("start", "--no-block", SERVICE)
    process = s.agent_process()
    lib.wait_until_larger(process, size)
    return process


@case(LARGE_HOME + "; " + SLOW_TIMER)
def ended_while_measuring_it_has_written_nothing(s):
    process = agent_that_measures(s)
    with lib.held(process):  # so that it is not done before the manager has come to it
        systemctl("stop", SERVICE)
    assert s.exit_of_agent() == "killed TERM success", s.exit_of_agent()
    assert s.reports() == [] and not PREFERENCES.exists()
    s.assert_switched_on()


@case(LARGE_HOME + "; " + SLOW_TIMER)
def ended_while_reporting_it_finishes_the_report(s):
    process = agent_that_measures(s)
    # Behind its messages the agent waits for the manager, which is to switch the job off: so it is there to be ended.
    with lib.held(lib.parent_of(process)):
        s.journal.wait(lib.is_report, "the first message")
        os.kill(process, signal.SIGTERM)
    s.wait_for_runs()
    assert s.exit_of_agent() == "exited 0 success", s.exit_of_agent()
    assert sorted(s.domains()) == sorted(BOTH), s.domains()
    assert s.last_version_run() == 4
    s.assert_switched_off()


@case(f"{LARGE_HOME}; {SLOW_TIMER}; {PRESSURE_FILE}")
def below_its_limit_it_goes_on_when_memory_is_short(s):
    pressure = os.open(PRESSURE, os.O_RDWR | os.O_NONBLOCK)
    process = agent_that_measures(s)
    with lib.held(process):
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
    pressure = os.open(PRESSURE, os.O_RDWR | os.O_NONBLOCK)
    process = agent_that_measures(s, entries=2_000_000, size=MEMORY_LIMIT)
    with lib.held(process):
        os.write(pressure, b"x")
    s.wait_for_runs()
    s.wait_for_agent_line(lambda line: line == "Norvex Memory Watchdog: Critical memory pressure detected. Exiting.")
    assert s.exit_of_agent() == "exited 0 success"
    assert s.reports() == [] and not PREFERENCES.exists()
    s.assert_switched_off()


if __name__ == "__main__":
    main(__file__)

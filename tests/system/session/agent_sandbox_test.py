#!/usr/bin/env python3
"""The service of the installed agent in a real user session: what its sandboxes close, and that no figure changes.

usage: see agent_session.py
"""

import json
import pathlib
import subprocess
import sys

import session as lib
from agent_session import BOTH, SLOW_TIMER, case, main
from session import HOME, PREFERENCES, SERVICE, TIMER, systemctl


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
    if subprocess.run(["unshare", "--user", "true"], capture_output=True).returncode != 0:
        print("users may have no namespaces of their own here, which the strict sandbox needs", file=sys.stderr)
        sys.exit(77)
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


if __name__ == "__main__":
    main(__file__)

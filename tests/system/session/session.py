"""A user session as a test sees it from inside: its manager, its journal, and what the agent left in it.

Everything that the session's programs do in their own time is waited for, with a bound.
"""

import contextlib
import json
import os
import pathlib
import re
import signal
import subprocess
import sys
import threading
import time

SERVICE = "com.brixo.NorvexAgent.service"
TIMER = os.environ.get("NORVEX_TIMER", "")
AGENT = "/usr/libexec/norvex/NorvexAgent"
LIMIT_S = 60

# The service manager's own message ids, of systemd-messages(7).
UNIT_STARTING = "7d4958e842da4a758f6c1cdc7b36dcc5"
UNIT_STARTED = "39f53479d3a045ac8e11786248231fbf"

HOME = pathlib.Path.home()
PREFERENCES = HOME / ".config/norvex/com.brixo.NorvexAgent.json"
MESSAGES_FILE = HOME / ".local/state/norvex/diagnostics.jsonl"


def run(*command, check=True):
    """What a command prints, without the last line feed."""
    done = subprocess.run(command, check=check, capture_output=True, text=True, timeout=LIMIT_S)
    return done.stdout.rstrip("\n")


def systemctl(*arguments, check=True):
    return run("systemctl", "--user", "--no-pager", *arguments, check=check)


def eventually(is_so, what):
    """For what tells nobody when it happens."""
    end = time.monotonic() + LIMIT_S
    while not is_so():
        assert time.monotonic() < end, f"it did not happen: {what}"
        time.sleep(0.01)


class Journal:
    """The session's journal, as it comes."""

    def __init__(self):
        # Without an entry of his own a user has no journal that could be followed.
        run("systemd-cat", "-t", "session-test", "echo", "begins")
        eventually(lambda: run("journalctl", "-q", "-t", "session-test", check=False), "a first entry")
        self._entries = []
        self._news = threading.Condition()
        self._reader = subprocess.Popen(
            ["journalctl", "-q", "-f", "-n", "all", "-o", "json", "--all"], stdout=subprocess.PIPE, text=True)
        threading.Thread(target=self._read, daemon=True).start()

    def _read(self):
        for line in self._reader.stdout:
            with self._news:
                self._entries.append(json.loads(line))
                self._news.notify_all()

    def close(self):
        self._reader.kill()
        self._reader.wait()

    def matching(self, test):
        with self._news:
            return [entry for entry in self._entries if test(entry)]

    def wait(self, test, what, count=1):
        """The first `count` entries for which the test holds."""
        end = time.monotonic() + LIMIT_S
        with self._news:
            while True:
                found = [entry for entry in self._entries if test(entry)]
                if len(found) >= count:
                    return found[:count]
                left = end - time.monotonic()
                assert left > 0, f"not {count} times in the journal: {what}\n{self.tail()}"
                self._news.wait(left)

    def tail(self):
        return "\n".join(str(entry.get("MESSAGE"))[:200] for entry in self._entries[-30:])


def of_service(entry, message_id=None):
    return entry.get("USER_UNIT") == SERVICE and (message_id is None or entry.get("MESSAGE_ID") == message_id)


def is_report(entry):
    return "NORVEX_DOMAIN" in entry


def says(text):
    return lambda entry: text in str(entry.get("MESSAGE"))


class Session:
    def __init__(self):
        self.journal = Journal()

    # What happened.

    def wait_for_runs(self, count=1):
        """Waits until so many starts of the service have come to their end, and not to a failure."""
        self.journal.wait(lambda entry: of_service(entry, UNIT_STARTED) and not says("was skipped")(entry),
                          "the service has finished", count)

    def starts(self):
        return len(self.journal.matching(lambda entry: of_service(entry, UNIT_STARTING)))

    def wait_for_skips(self, condition, count):
        self.journal.wait(lambda entry: of_service(entry) and says("was skipped")(entry) and says(condition)(entry),
                          f"skipped for {condition}", count)

    def agent_process(self):
        """The process of the agent itself, once the service has come to it."""
        found = []

        def is_there():
            main = int(systemctl("show", "-P", "MainPID", SERVICE))
            with contextlib.suppress(OSError):  # it is not there yet, or no longer
                if main and os.path.basename(os.readlink(f"/proc/{main}/exe")) == "NorvexAgent":
                    found.append(main)
            return bool(found)

        eventually(is_there, "the agent is running")
        return found[0]

    # What it left.

    def reports(self):
        return self.journal.matching(is_report)

    def domains(self):
        return [entry["NORVEX_DOMAIN"] for entry in self.reports()]

    def last_version_run(self):
        return json.loads(PREFERENCES.read_text())["LastVersionRun"] if PREFERENCES.exists() else None

    def wait_for_agent_line(self, test, count=1):
        """What the agent tells the system log comes another way than what the manager tells, and may come after it."""
        self.journal.wait(lambda entry: entry.get("SYSLOG_IDENTIFIER") == "NorvexAgent" and not is_report(entry)
                          and test(entry["MESSAGE"]), "what the agent says", count)

    def exit_of_agent(self):
        """How its last process ended, with which status, and what the service manager makes of it."""
        self.journal.wait(says("ended: "), "how the agent ended")
        return self.journal.matching(says("ended: "))[-1]["MESSAGE"].removeprefix("ended: ")

    def timer_state(self):
        """(whether it will be started at a login, whether it is waiting now)"""
        return systemctl("is-enabled", TIMER, check=False), systemctl("is-active", TIMER, check=False)

    def assert_switched_on(self):
        assert self.timer_state() == ("enabled", "active"), self.timer_state()

    def assert_switched_off(self):
        self.journal.wait(says("com.brixo.NorvexAgent disabled"), "the agent has switched its job off")
        assert self.timer_state() == ("masked", "inactive"), self.timer_state()

    def assert_does_not_start_again(self):
        """By a timer of its own, which comes after two more turns of the agent's would have come."""
        before = self.starts()
        unit = f"control-{time.monotonic_ns()}"
        run("systemd-run", "--user", "--quiet", f"--unit={unit}", "--on-active=2100ms",
            "--timer-property=AccuracySec=50ms", "/bin/true")
        self.journal.wait(lambda entry: entry.get("USER_UNIT") == f"{unit}.service"
                          and entry.get("MESSAGE_ID") == UNIT_STARTED, "the control timer has come")
        assert self.starts() == before, "it was started again"

    # What a user does.

    def log_out_and_in(self):
        started = "UserspaceTimestampMonotonic"
        before = systemctl("show", "-P", started)
        systemctl("exit", check=False)

        def is_new():
            now = systemctl("show", "-P", started, check=False)
            return now not in ("", before) and systemctl("is-system-running", check=False) in ("running", "degraded")

        eventually(is_new, "a new manager")

    def try_every_second(self):
        drop_ins = HOME / f".config/systemd/user/{TIMER}.d"
        drop_ins.mkdir(parents=True)
        (drop_ins / "every-second.conf").symlink_to("/run/session-test/every-second.conf")
        systemctl("daemon-reload")
        systemctl("restart", TIMER)

    def switch_on(self):
        systemctl("unmask", TIMER)
        systemctl("start", TIMER)


def anonymous_memory(process):
    """Bytes of the process's own memory; 0 when it has gone."""
    try:
        lines = pathlib.Path(f"/proc/{process}/status").read_text().splitlines()
    except (FileNotFoundError, ProcessLookupError):
        return 0
    return sum(int(line.split()[1]) * 1024 for line in lines if line.startswith(("RssAnon:", "VmSwap:")))


def parent_of(process):
    return int(pathlib.Path(f"/proc/{process}/stat").read_text().rpartition(")")[2].split()[1])


@contextlib.contextmanager
def held(process):
    """Does not run inside the block, unless the service manager ends it there: that lets it go on to its end."""
    os.kill(process, signal.SIGSTOP)
    try:
        yield
    finally:
        with contextlib.suppress(ProcessLookupError):
            os.kill(process, signal.SIGCONT)


def wait_until_larger(process, limit):
    def is_larger():
        size = anonymous_memory(process)
        assert size, "the agent ended before it was as large as it should become"
        return size > limit

    eventually(is_larger, f"the agent holds more than {limit} bytes")


def fill_folder(folder, entries):
    """Many entries with long names, all of them one file."""
    folder.mkdir(parents=True, exist_ok=True)
    descriptor = os.open(folder, os.O_RDONLY | os.O_DIRECTORY)
    first = f"{0:0250d}"
    os.close(os.open(first, os.O_CREAT | os.O_WRONLY, 0o600, dir_fd=descriptor))
    for number in range(1, entries):
        os.link(first, f"{number:0250d}", src_dir_fd=descriptor, dst_dir_fd=descriptor)
    os.close(descriptor)


def claim_of(name):
    """a_claim_like_this as AClaimLikeThis"""
    return re.sub(r"(?:^|_)([a-z])", lambda match: match.group(1).upper(), name)


def run_inside(test):
    """Runs a test of the session that this process is in; tells the end of the journal when it fails."""
    session = Session()
    try:
        test(session)
    except BaseException:
        print(session.journal.tail(), file=sys.stderr)
        raise
    finally:
        session.journal.close()

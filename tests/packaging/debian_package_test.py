#!/usr/bin/env python3
"""The Debian package, installed, upgraded, removed and purged for real, in a throw-away session of root.

usage: debian_package_test.py --list
       debian_package_test.py --make BUILD NEXT_AGENT FOLDER
       debian_package_test.py CASE FOLDER

The packages are made once, in FOLDER: this release's by cpack from the build folder BUILD, and the next release's out of
it, with NEXT_AGENT, which has the next run version, with a timer of that name, and a higher version. Exit status 77: no
session can be made here.
"""

import hashlib
import os
import pathlib
import re
import shutil
import subprocess
import sys

ROOT = pathlib.Path(__file__).resolve().parent.parent.parent
sys.path[:0] = ["/run/session-test", str(ROOT / "tests/system/session")]
import session as lib  # noqa: E402
from session import HOME, TIMER, systemctl  # noqa: E402

PYTHON = "/usr/bin/python3"
PACKAGES = pathlib.Path("/run/session-test")
THIS, NEXT = PACKAGES / "this.deb", PACKAGES / "next.deb"
NEXT_TIMER = re.sub(r"run(\d+)", lambda m: f"run{int(m.group(1)) + 1}", TIMER)

LINKS = pathlib.Path("/etc/systemd/user/timers.target.wants")
STATES = pathlib.Path("/var/lib/systemd/deb-systemd-user-helper-enabled")

cases = {}


def case(test):
    cases[test.__name__] = test
    return test


def dpkg(*arguments):
    environment = {**os.environ, "DEBIAN_FRONTEND": "noninteractive", "PATH": "/usr/sbin:/usr/bin:/sbin:/bin"}
    done = subprocess.run(["dpkg", "--force-unsafe-io", *map(str, arguments)], env=environment,
                          capture_output=True, text=True, timeout=lib.LIMIT_S)
    assert done.returncode == 0, done.stdout + done.stderr


def enabled_timers():
    return {path.name for path in LINKS.glob("com.brixo.*")} if LINKS.exists() else set()


def known_timers():
    return {path.name for path in STATES.rglob("com.brixo.*")} if STATES.exists() else set()


def files_of_the_system():
    """What could be left behind; of the folders that dpkg and others keep their own books in, only units."""
    roots = ("/etc", "/usr/bin", "/usr/libexec", "/usr/lib/systemd", "/usr/share/norvex", "/usr/share/doc/norvex",
             "/var/lib/systemd/deb-systemd-user-helper-enabled", "/var/lib/systemd/deb-systemd-user-helper-masked")
    return {str(path) for root in roots for path in pathlib.Path(root).rglob("*")}


def measure_small_volume():
    """The user's own settings: the machine's volumes would take long."""
    settings = HOME / ".config/chronel/backup.conf"
    settings.parent.mkdir(parents=True)
    settings.write_text("[Backup]\nIncludedVolumes=/media/volume\n")


@case
def installed_it_reports_and_after_an_upgrade_again(s):
    measure_small_volume()
    dpkg("-i", THIS)
    assert enabled_timers() == {TIMER}
    s.log_out_and_in()
    s.wait_for_runs()
    this_version = int(re.search(r"run(\d+)", TIMER).group(1))
    assert s.last_version_run() == this_version and len(s.reports()) == 2
    assert s.reports()[0]["MESSAGE_ID"] in lib.run("journalctl", "--list-catalog")
    s.assert_switched_off()

    dpkg("-i", NEXT)
    assert enabled_timers() == {NEXT_TIMER}
    assert not any(TIMER in name for name in known_timers()), known_timers()
    s.log_out_and_in()
    s.wait_for_runs(2)
    assert s.last_version_run() == this_version + 1 and len(s.reports()) == 4


@case
def the_same_release_again_leaves_a_switched_off_job_off(s):
    measure_small_volume()
    dpkg("-i", THIS)
    s.log_out_and_in()
    s.wait_for_runs()
    dpkg("-i", THIS)
    s.log_out_and_in()
    assert s.timer_state() == ("masked", "inactive"), s.timer_state()


@case
def what_the_administrator_disabled_stays_disabled(s):
    del s
    dpkg("-i", THIS)
    lib.run("systemctl", "--global", "disable", TIMER)
    dpkg("-i", THIS)
    assert enabled_timers() == set()
    dpkg("-i", NEXT)
    assert enabled_timers() == set()


@case
def removed_and_installed_again_it_is_on_again(s):
    del s
    dpkg("-i", THIS)
    dpkg("--remove", "norvex")
    assert not pathlib.Path("/usr/bin/norvexctl").exists()
    assert pathlib.Path("/etc/chronel/backup.conf").exists()
    assert lib.run("systemctl", "--global", "is-enabled", TIMER, check=False) in ("masked", "")
    dpkg("-i", THIS)
    assert enabled_timers() == {TIMER}
    assert lib.run("systemctl", "--global", "is-enabled", TIMER) == "enabled"


@case
def purged_it_leaves_the_users_files_and_nothing_else(s):
    measure_small_volume()
    before = files_of_the_system()
    dpkg("-i", THIS)
    s.log_out_and_in()
    s.wait_for_runs()
    dpkg("-i", NEXT)
    dpkg("--purge", "norvex")
    left = files_of_the_system() - before
    # The folders that the helper keeps its books in are the helper's.
    assert {path for path in left if "norvex" in path.lower() or not os.path.isdir(path)} == set(), left
    assert not pathlib.Path("/etc/chronel").exists()
    assert lib.PREFERENCES.exists() and (HOME / ".cache/norvex/index").exists()


@case
def a_changed_configuration_outlives_an_upgrade(s):
    del s
    dpkg("-i", THIS)
    settings = pathlib.Path("/etc/chronel/backup.conf")
    assert "\nIncludedVolumes=auto\n" in settings.read_text()
    changed = settings.read_text().replace("=auto", "=/home")
    settings.write_text(changed)
    dpkg("-i", NEXT)
    assert settings.read_text() == changed


# Around a case.


SETUP = r"""
set -e
for folder in lib cache; do
    mkdir -p /run/machine/var-$folder/upper /run/machine/var-$folder/work
    mount -t overlay overlay /var/$folder -o \
        "lowerdir=/var/$folder,upperdir=/run/machine/var-$folder/upper,workdir=/run/machine/var-$folder/work"
done
dpkg --purge --force-all norvex >/dev/null 2>&1 || true
rm -f /var/lib/man-db/auto-update  # reading all manual pages anew takes longer than all else
mkdir -p /media/volume /run/session-test
cp @FILES@ /run/session-test  # they may lie below the folder that is hidden next
mount -t tmpfs tmpfs /media/volume
echo text >/media/volume/letter.txt
mount -t tmpfs tmpfs /root
for timer in @TIMER@ @NEXT_TIMER@; do
    mkdir -p /run/systemd/user/$timer.d
    printf '[Timer]\nOnActiveSec=\nOnCalendar=\nOnCalendar=*-*-* *:*:*\nAccuracySec=50ms\nRandomizedDelaySec=0\n' \
        >/run/systemd/user/$timer.d/every-second.conf
done
# How busy this machine is, and how it gets its power, decides nothing here.
mkdir -p /run/systemd/user/com.brixo.NorvexAgent.service.d
printf '[Unit]\nConditionACPower=\n[Service]\nCPUSchedulingPolicy=other\nNice=0\n' \
    >/run/systemd/user/com.brixo.NorvexAgent.service.d/always.conf
"""


def make_this_package(build, folder):
    lib.run("cpack", "--config", f"{build}/CPackConfig.cmake", "-G", "DEB", "-B", str(folder / "cpack"))
    made = list((folder / "cpack").glob("*.deb"))
    assert len(made) == 1, made
    made[0].rename(folder / THIS.name)


def make_next_package(next_agent, folder):
    """The same package as the next release would build it."""
    tree = folder / "next"
    lib.run("dpkg-deb", "--raw-extract", str(folder / THIS.name), str(tree))
    units = tree / "usr/lib/systemd/user"
    (units / TIMER).rename(units / NEXT_TIMER)
    for file in [*(tree / "DEBIAN").iterdir(), *(tree / "usr/lib/systemd").rglob("*.*")]:
        if file.is_file():
            file.write_text(file.read_text().replace(TIMER, NEXT_TIMER))
    control = tree / "DEBIAN/control"
    control.write_text(re.sub(r"^Version: (\d+)", lambda m: f"Version: {int(m.group(1)) + 1}", control.read_text(),
                              flags=re.M))
    shutil.copy(next_agent, tree / "usr/libexec/norvex/NorvexAgent")
    installed = [file for file in tree.rglob("*") if file.is_file() and "DEBIAN" not in file.parts]
    (tree / "DEBIAN/md5sums").write_text("".join(
        f"{hashlib.md5(file.read_bytes()).hexdigest()}  {file.relative_to(tree)}\n" for file in installed))
    lib.run("dpkg-deb", "-Znone", "--root-owner-group", "--build", str(tree), str(folder / NEXT.name))


def make_packages(build, next_agent, folder):
    folder = pathlib.Path(folder)
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
    make_this_package(build, folder)
    make_next_package(next_agent, folder)


def run_in_session(name, folder):
    files = [f"{folder}/{THIS.name}", f"{folder}/{NEXT.name}", __file__, lib.__file__]
    setup = SETUP.replace("@TIMER@", TIMER).replace("@NEXT_TIMER@", NEXT_TIMER)
    setup = setup.replace("@FILES@", " ".join(f"'{file}'" for file in files))
    harness = str(ROOT / "tests/system/with-user-session")
    os.chdir("/")
    os.execv(harness, [harness, "-r", "-s", setup, "env", f"NORVEX_TIMER={TIMER}", "PYTHONDONTWRITEBYTECODE=1", PYTHON,
                       "/run/session-test/debian_package_test.py", "--inside", name])


def main():
    if sys.argv[1:] == ["--list"]:
        print("\n".join(f"{lib.claim_of(name)}={name}" for name in cases))
    elif sys.argv[1] == "--inside":
        lib.run_inside(cases[sys.argv[2]])
    elif sys.argv[1] == "--make":
        make_packages(*sys.argv[2:])
    else:
        run_in_session(*sys.argv[1:])


if __name__ == "__main__":
    main()

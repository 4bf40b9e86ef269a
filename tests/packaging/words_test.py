#!/usr/bin/env python3
"""Every command and option of a program is completed in each shell, asked of the shells themselves, and is in the manual.

usage: words_test.py PROGRAM FOLDER MANUAL      FOLDER holds the completions, MANUAL is the page of the program
"""

import pathlib
import re
import subprocess
import sys
import unittest

PROGRAM = pathlib.Path(sys.argv[1])
FOLDER = pathlib.Path(sys.argv[2])
MANUAL = pathlib.Path(sys.argv[3])
LIMIT_S = 60


def words_of(command):
    """What the help of a command says may follow it: the commands and the options."""
    text = subprocess.run([PROGRAM, *command, "--help"], check=True, capture_output=True, text=True,
                          timeout=LIMIT_S).stdout
    sections = dict(re.findall(r"^([A-Z][a-z]+):\n((?:  .*\n?)+)", text, re.M))
    commands = re.findall(r"^  (\w+)", sections.get("Subcommands", ""), re.M)
    options = [name for left in re.findall(r"^  (-[-\w,]+)", sections["Options"], re.M) for name in left.split(",")]
    return commands, options


def all_commands(command=()):
    yield command
    for word in words_of(command)[0]:
        yield from all_commands((*command, word))


def bash_offers(command, start):
    script = """source "$1"; shift; COMP_WORDS=("$@"); COMP_CWORD=$(($# - 1)); _norvexctl; printf '%s\\n' "${COMPREPLY[@]}" """
    # compopt works only while bash itself completes.
    return output("bash", "-c", "compopt() { :; }; " + script, "bash", FOLDER / "norvexctl", "norvexctl", *command, start)


def fish_offers(command, start):
    line = " ".join(["norvexctl", *command, start])
    found = output("fish", "--no-config", "-c", f"source {FOLDER}/norvexctl.fish; complete -C '{line}'")
    return [offer.split("\t")[0] for offer in found]


def output(*command):
    return subprocess.run(command, check=True, capture_output=True, text=True, timeout=LIMIT_S).stdout.splitlines()


class Completions(unittest.TestCase):
    def expect_all_offered(self, offers):
        for command in all_commands():
            commands, options = words_of(command)
            with self.subTest(command=command):
                self.assertLessEqual(set(commands), set(offers(command, "")))
                long_options = {option for option in options if option.startswith("--")}
                self.assertLessEqual(long_options, set(offers(command, "--")))
                self.assertTrue(options)

    def test_bash_offers_every_command_and_option(self):
        self.expect_all_offered(bash_offers)

    def test_fish_offers_every_command_and_option(self):
        self.expect_all_offered(fish_offers)

    def test_bash_offers_folders_where_a_volume_is_meant(self):
        self.assertIn("/usr", bash_offers(("index", "update"), "/us"))
        self.assertIn("/usr", bash_offers(("index", "query", "--volume"), "/us"))

    def test_zsh_reads_the_file_and_it_names_every_command_and_option(self):
        output("zsh", "-n", FOLDER / "_norvexctl")
        text = (FOLDER / "_norvexctl").read_text()
        functions = dict(re.findall(r"^(_norvexctl\w*)\(\) \{\n(.*?)^\}", text, re.M | re.S))
        for command in all_commands():
            commands, options = words_of(command)
            body = functions["_".join(["_norvexctl", *command])]
            for word in commands:
                self.assertIn(f"'{word}:", body)
                self.assertIn(f"{word}) _norvexctl_{'_'.join([*command, word])} ;;", body)
            for option in options:
                self.assertRegex(body, rf"'\*?{option}\[")


class Manual(unittest.TestCase):
    page = re.sub(r"\\f[BIR]", "", MANUAL.read_text()).replace("\\-", "-")
    synopsis = re.search(r"^\.SH SYNOPSIS\n(.*?)^\.SH", page, re.M | re.S).group(1)

    def lines_of(self, command):
        return [line for line in self.synopsis.splitlines() if re.match(rf"\.B norvexctl {' '.join(command)}( |$)", line)]

    def test_names_every_command_and_option(self):
        for command in all_commands():
            commands, options = words_of(command)
            with self.subTest(command=command):
                if command and not commands:
                    self.assertEqual(len(self.lines_of(command)), 1)
                for option in options:
                    self.assertIn(option, self.page)

    def test_names_no_command_that_there_is_not(self):
        known = {" ".join(command) for command in all_commands()}
        for line in self.synopsis.splitlines():
            if named := re.match(r"\.B norvexctl ([a-z ]*[a-z])", line):
                self.assertIn(named.group(1), known)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])

#!/usr/bin/env python3
"""Writes the shell completions of a program from its own --help, for bash, zsh and fish.

usage: generate.py PROGRAM FOLDER

There is no list of commands to keep: what the help of each command names is completed, and nothing else. What may stand
for an argument follows from the word that the help uses for it, see KINDS.
"""

import pathlib
import re
import subprocess
import sys
from dataclasses import dataclass, field

# What an argument is, by its word in the help; any other word is free text.
KINDS = {"VOLUME": "folder", "FOLDER": "folder", "PATH": "path", "FILE": "path"}
TEXT = "text"


@dataclass
class Option:
    names: list  # of one option: "-0", "--null"
    text: str
    kind: str | None  # of its value; None when it takes none


@dataclass
class Command:
    words: tuple  # behind the program's name
    text: str = ""
    options: list = field(default_factory=list)
    arguments: list = field(default_factory=list)  # kinds
    commands: list = field(default_factory=list)  # those below, as Command

    def everything(self):
        yield self
        for command in self.commands:
            yield from command.everything()


def kind_of(word):
    return KINDS.get(re.sub(r"[^A-Z].*", "", word), TEXT)


def option_of(left, text):
    names = re.findall(r"--?[A-Za-z0-9][-A-Za-z0-9]*", left.split(" ")[0])
    value = re.match(r"\S+ ([A-Z]+)( |$)", left)  # "--volume VOLUME", but not "--count Excludes: --null"
    return Option(names, text, kind_of(value.group(1)) if value else None)


def rows(lines):
    """The rows of one section: the left part and the text, which stands in the next line where the left part is long."""
    found = []
    for line in lines:
        if re.match(r"  \S", line):
            left, _, text = line.strip().partition("  ")
            found.append([left, text.strip()])
        elif found:
            found[-1][1] = f"{found[-1][1]} {line.strip()}".strip()
    return found


def sections(help_text):
    title, lines = None, {}
    for line in help_text.splitlines():
        if re.match(r"[A-Z][a-z]+:$", line):
            title = line[:-1]
        elif not line.startswith(" ") and line:
            title = None
        elif title:
            lines.setdefault(title, []).append(line)
    return lines


def read(program, words=(), text=""):
    help_text = subprocess.run([program, *words, "--help"], check=True, capture_output=True, text=True).stdout
    parts = sections(help_text)
    command = Command(words, text)
    command.options = [option_of(left, text) for left, text in rows(parts.get("Options", []))]
    command.arguments = [kind_of(left) for left, _ in rows(parts.get("Positionals", []))]
    command.commands = [read(program, (*words, left), text) for left, text in rows(parts.get("Subcommands", []))]
    if not command.options:
        sys.exit(f"generate.py: the help of {' '.join([program, *words])} is not understood")
    return command


def bash(root, name):
    """One line a command: what may follow its words."""
    cases, values = [], []
    for command in root.everything():
        words = [c.words[-1] for c in command.commands] + [n for o in command.options for n in o.names]
        kind = command.arguments[0] if command.arguments else "none"
        cases.append(f"    '{' '.join(command.words)}') words='{' '.join(words)}' kind={kind} ;;")
        for option in command.options:
            if option.kind:
                names = "|".join(option.names)
                values.append(f"    {names}) kind={option.kind} words= ;;")
    paths = " | ".join(f"'{' '.join(c.words)}'" for c in root.everything() if c.words)
    return "\n".join([
        f"# bash completion of {name}", "",
        f"_{name}() {{",
        "  local current=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]}",
        "  local command= words= kind=none word",
        "  for word in \"${COMP_WORDS[@]:1:COMP_CWORD - 1}\"; do",
        "    case \"${command:+$command }$word\" in",
        f"    {paths}) command=\"${{command:+$command }}$word\" ;;",
        "    esac",
        "  done",
        "  case \"$command\" in", *cases, "  esac",
        "  case \"$previous\" in", *sorted(set(values)), "  esac",
        "  COMPREPLY=($(compgen -W \"$words\" -- \"$current\"))",
        "  case \"$current\" in -*) return ;; esac",
        "  case $kind in",
        "  folder) compopt -o filenames; mapfile -t -O ${#COMPREPLY[@]} COMPREPLY < <(compgen -d -- \"$current\") ;;",
        "  path) compopt -o filenames; mapfile -t -O ${#COMPREPLY[@]} COMPREPLY < <(compgen -f -- \"$current\") ;;",
        "  esac",
        "}",
        f"complete -F _{name} {name}", ""])


def zsh_text(text):
    return re.sub(r"([\[\]:'\\])", lambda m: "'\\''" if m.group() == "'" else "\\" + m.group(), text)


ZSH_ACTIONS = {"folder": "_files -/", "path": "_files", TEXT: " "}


def zsh_option(option):
    value = f":value:{ZSH_ACTIONS[option.kind]}" if option.kind else ""
    return [f"'{'*' if option.kind else ''}{name}[{zsh_text(option.text)}]{value}'" for name in option.names]


def zsh_function(command, name):
    function = "_".join(["", name, *command.words])
    specs = [spec for option in command.options for spec in zsh_option(option)]
    if not command.commands:
        specs += [f"'*:argument:{ZSH_ACTIONS[kind]}'" for kind in command.arguments]
        return [f"{function}() {{", "  _arguments -s \\", *[f"    {s} \\" for s in specs], "    && return", "}"]
    described = [f"    '{c.words[-1]}:{zsh_text(c.text)}'" for c in command.commands]
    return [f"{function}() {{",
            "  local context state state_descr line",
            "  typeset -A opt_args",
            "  local -a commands=(", *described, "  )",
            "  _arguments -C \\", *[f"    {s} \\" for s in specs],
            "    '1:command:->command' '*::argument:->argument' && return",
            "  case $state in",
            "  command) _describe command commands ;;",
            "  argument)",
            "    case $words[1] in",
            *[f"    {c.words[-1]}) {function}_{c.words[-1]} ;;" for c in command.commands],
            "    esac ;;",
            "  esac",
            "}"]


def zsh(root, name):
    lines = [f"#compdef {name}", f"# zsh completion of {name}"]
    for command in reversed(list(root.everything())):
        lines += ["", *zsh_function(command, name)]
    return "\n".join([*lines, "", f'_{name} "$@"', ""])


def fish_text(text):
    return "'" + text.replace("\\", "\\\\").replace("'", "\\'") + "'"


FISH_ACTIONS = {"folder": "-a '(__fish_complete_directories)'", "path": "-F", TEXT: ""}


def fish(root, name):
    at = f"__{name}_at"
    lines = [f"# fish completion of {name}", "",
             f"# Whether the words so far, options aside, are those of the given command.",
             f"function {at}",
             "    set -l words (commandline -opc)[2..-1]",
             "    set words (string match -v -- '-*' $words)",
             "    set -l wanted (string split -n ' ' -- $argv[1])",
             "    set -l depth (count $wanted)",
             "    test (count $words) -ge $depth; or return 1",
             "    set -q argv[2]; and test (count $words) -ne $depth; and return 1",
             "    test $depth -eq 0; and return 0",
             "    test \"$words[1..$depth]\" = \"$wanted\"",
             "end", "",
             f"complete -c {name} -f"]
    for command in root.everything():
        words = " ".join(command.words)
        leaf = "" if not command.commands else " only"
        here = f"complete -c {name} -n \"{at} '{words}'{leaf}\""
        lines += [f"{here} -a {c.words[-1]} -d {fish_text(c.text)}" for c in command.commands]
        for option in command.options:
            names = " ".join(f"-l {n[2:]}" if n.startswith("--") else f"-s {n[1:]}" for n in option.names)
            value = f" -x {FISH_ACTIONS[option.kind]}".rstrip() if option.kind else ""
            lines.append(f"{here} {names}{value} -d {fish_text(option.text)}")
        lines += [f"{here} {FISH_ACTIONS[kind]}" for kind in command.arguments if FISH_ACTIONS[kind]]
    return "\n".join([*lines, ""])


def main():
    program, folder = sys.argv[1], pathlib.Path(sys.argv[2])
    name = pathlib.Path(program).name
    root = read(program)
    folder.mkdir(parents=True, exist_ok=True)
    for file, write in ((name, bash), ("_" + name, zsh), (name + ".fish", fish)):
        (folder / file).write_text(write(root, name))


if __name__ == "__main__":
    main()

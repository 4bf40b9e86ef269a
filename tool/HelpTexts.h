// What stands below the options in the help of each command: defaults, and an example.
//
// Used by CommandLine.cpp alone.
#pragma once

namespace norvex::help {

inline constexpr const char* kProgram =
    "Example:\n"
    "  norvexctl preview\n"
    "\n"
    "Exit status: 0 done, 1 something could not be done, 2 the command line makes no sense.";

inline constexpr const char* kIndex =
    "Example:\n"
    "  norvexctl index update && norvexctl index status";

inline constexpr const char* kIndexUpdate =
    "Without VOLUME: the included volumes of the backup settings (chronel/backup.conf).\n"
    "Ctrl-C leaves every index as it was.\n"
    "\n"
    "Example:\n"
    "  norvexctl index update / /home";

inline constexpr const char* kIndexStatus =
    "Without VOLUME: the included volumes of the backup settings.\n"
    "\n"
    "Example:\n"
    "  norvexctl index status /";

inline constexpr const char* kIndexQuery =
    "Without --volume: the included volumes that have an index.\n"
    "\n"
    "A predicate compares attributes (== != < <= > >=, InRange(attribute, low, high), attribute == *),\n"
    "joined by && || ! and parentheses. In a string, * stands for anything; behind it, c ignores case\n"
    "and d diacritics. `norvexctl index show PATH` names the attributes of an item.\n"
    "\n"
    "Examples:\n"
    "  norvexctl index query 'kMDItemFSName == \"*.iso\"c && kMDItemFSSize > 1000000000'\n"
    "  norvexctl index query --null 'kMDItemContentTypeTree == \"public.image\"' | xargs -0 ls -l";

inline constexpr const char* kIndexShow =
    "Example:\n"
    "  norvexctl index show ~/Downloads";

inline constexpr const char* kPreview =
    "Measures as the agent would, and shows each message that would be sent: each key, the exact figure,\n"
    "and the rounded text that would be sent for it. Nothing is sent, and nothing but the index is written.\n"
    "\n"
    "Example:\n"
    "  norvexctl preview --no-index";

inline constexpr const char* kSummary =
    "The figures stay on this machine. `norvexctl preview` shows what of them would be reported.\n"
    "\n"
    "Example:\n"
    "  norvexctl summary | grep -i music";

inline constexpr const char* kShow =
    "Shows each volume, what is on it by kind, where images, music and movies lie, and what was bought.\n"
    "The page of --html needs no network; it replaces the file in one step, readable by you alone.\n"
    "\n"
    "Example:\n"
    "  norvexctl show --html ~/storage.html";

inline constexpr const char* kLog =
    "From the system's journal, and from the agent's own file where there was no journal; the newest last.\n"
    "A MOMENT: 2026-11-21, \"2026-11-21 07:03\", today, or how long ago: 45min, 12h, 3d, 2w.\n"
    "\n"
    "Example:\n"
    "  norvexctl log --since 2w --domain run2";

inline constexpr const char* kAgent =
    "Example:\n"
    "  norvexctl agent status";

inline constexpr const char* kAgentStatus =
    "Shows when this release has reported, whether the job is on and who has decided that, and, when "
    "nothing\n"
    "has been reported, what of the last run and of the included volumes tells why.\n"
    "\n"
    "Example:\n"
    "  norvexctl agent status --json";

inline constexpr const char* kAgentRun =
    "The job's conditions hold: not on battery, not while other programs wait for memory, disk or "
    "processor,\n"
    "and not where reporting is switched off. The agent reports only if this release has not.\n"
    "\n"
    "Example:\n"
    "  norvexctl agent run && norvexctl agent status";

inline constexpr const char* kAgentEnable =
    "Example:\n"
    "  norvexctl agent enable";

inline constexpr const char* kAgentDisable =
    "For good, in all releases: echo DO_NOT_TRACK=1 >> ~/.config/environment.d/norvex.conf\n"
    "\n"
    "Example:\n"
    "  norvexctl agent disable";

inline constexpr const char* kDoctor =
    "Exit status 1 when something is broken; what has a substitute is told and no failure.\n"
    "\n"
    "Example:\n"
    "  norvexctl doctor";

}  // namespace norvex::help

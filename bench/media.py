"""Runs the media reader, the TagLib program and exiftool in turns and compares their medians.

The reader and the TagLib program read the same list in the same kind of loop, and each tells how long its loop took: the
start of a process, which is the same for both and nobody's reading, is left out. With it, for whole processes, the ratio is
printed too. Of exiftool the whole process counts.
"""

import json, os, statistics, subprocess, sys, time

root, programs = sys.argv[1:]
ROUNDS, EXIFTOOL_ROUNDS = 31, 3
entries = [json.loads(line) for line in open(os.path.join(root, "manifest.jsonl"))]
listing = os.path.join(root, "list")
with open(listing, "w") as out:
    out.writelines(os.path.join(root, entry["path"]) + "\n" for entry in entries)
purchased = sum("purd" in entry["keys"] for entry in entries)

contenders = {
    "reader": [os.path.join(programs, "norvex_media_keys"), listing],
    "taglib": [os.path.join(programs, "norvex_taglib_peer"), listing],
    "exiftool": ["exiftool", "-q", "-q", "-fast", "-api", "LargeFileSupport=1", "-S", "-ItemList:PurchaseDate", "-@", listing],
}

def answer(name, output):
    """How many files the program takes for purchased, and how long its loop took, where it tells."""
    if name == "exiftool":
        return output.count("PurchaseDate:"), None
    words = output.split()
    return int(words[1]), float(words[5])

loops = {name: [] for name in contenders}
wholes = {name: [] for name in contenders}
for turn in range(ROUNDS):
    for name, command in contenders.items():
        if name == "exiftool" and turn >= EXIFTOOL_ROUNDS:
            continue
        start = time.perf_counter()
        done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
        whole = time.perf_counter() - start
        found, loop = answer(name, done.stdout)
        if found != purchased:
            sys.exit("%s found %d purchased files of %d" % (name, found, purchased))
        wholes[name].append(whole)
        loops[name].append(whole if loop is None else loop)

loop = {name: statistics.median(taken) for name, taken in loops.items()}
whole = {name: statistics.median(taken) for name, taken in wholes.items()}
print("%d files, %d of them purchased; page cache warm; median of %d runs (exiftool %d)"
      % (len(entries), purchased, ROUNDS, EXIFTOOL_ROUNDS))
for name in contenders:
    print("%-9s %9.2f ms   %6.1f us a file   fastest %.2f ms   whole process %.2f ms"
          % (name, loop[name] * 1e3, loop[name] * 1e6 / len(entries), min(loops[name]) * 1e3, whole[name] * 1e3))
kept = True
for name, goal in (("taglib", 8), ("exiftool", 300)):
    own = loop if name == "taglib" else whole
    ratio = own[name] / own["reader"]
    kept &= ratio >= goal
    print("reader takes 1/%.1f of %s (goal: at most 1/%d)%s" % (ratio, name, goal, "" if ratio >= goal else "   MISSED"))
print("whole processes: 1/%.1f of taglib" % (whole["taglib"] / whole["reader"]))
sys.exit(0 if kept else 1)

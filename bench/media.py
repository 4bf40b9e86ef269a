"""Runs the media reader, the TagLib program and exiftool in turns and compares their median wall times."""

import json, os, statistics, subprocess, sys, time

root, programs = sys.argv[1:]
ROUNDS, EXIFTOOL_ROUNDS = 15, 3
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
    """How many files the program takes for purchased."""
    return output.count("PurchaseDate:") if name == "exiftool" else int(output.split()[1])

times = {name: [] for name in contenders}
for turn in range(ROUNDS):
    for name, command in contenders.items():
        if name == "exiftool" and turn >= EXIFTOOL_ROUNDS:
            continue
        start = time.perf_counter()
        done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
        times[name].append(time.perf_counter() - start)
        if answer(name, done.stdout) != purchased:
            sys.exit("%s found %d purchased files of %d" % (name, answer(name, done.stdout), purchased))

median = {name: statistics.median(taken) for name, taken in times.items()}
print("%d files, %d of them purchased; page cache warm; median of %d runs (exiftool %d)"
      % (len(entries), purchased, ROUNDS, EXIFTOOL_ROUNDS))
for name, seconds in median.items():
    print("%-9s %9.2f ms   %6.1f us a file   fastest %.2f ms"
          % (name, seconds * 1e3, seconds * 1e6 / len(entries), min(times[name]) * 1e3))
kept = True
for name, goal in (("taglib", 8), ("exiftool", 300)):
    ratio = median[name] / median["reader"]
    kept &= ratio >= goal
    print("reader takes 1/%.0f of %s (goal: at most 1/%d)%s" % (ratio, name, goal, "" if ratio >= goal else "   MISSED"))
sys.exit(0 if kept else 1)

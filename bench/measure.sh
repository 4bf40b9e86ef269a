# What the sections of scripts/bench share. To be sourced.

kept=0 # 1 once a limit has not been kept

# make_once TREE COMMAND...: runs the command, which makes TREE; a tree that was not finished does not count.
make_once() {
  local tree=$1
  shift
  [ -e "$tree.made" ] && return
  say "Making ${tree##*/} ..."
  rm -rf "$tree"
  "$@" >"$tree.log"
  touch "$tree.made"
}

count_items() { find "$1" -mindepth 1 -printf . | wc -c; }

# mixed_tree TREE ITEMS: folders of 2 to 40 items of which a tenth are folders, at random places: about eleven levels.
mixed_tree() {
  python3 - "$@" <<'PYTHON'
import os, random, sys

root, total = sys.argv[1], int(sys.argv[2])
random.seed(1)
extensions = [".txt", ".c", ".h", ".jpg", ".png", ".mp3", ".mp4", ".o", ".js", ".json", ".py", "", ".so.1", ".pdf", ".html"]
words = "alpha beta gamma delta report photo index main module config test data image view model".split()
os.makedirs(root)
folders, made = [root], 0
while made < total:
    folder = random.choice(folders)
    for _ in range(min(random.choice([2, 5, 10, 10, 20, 40]), total - made)):
        path = "%s/%s-%s%d" % (folder, random.choice(words), random.choice(words), made)
        made += 1
        if random.random() < 0.1:
            os.mkdir(path)
            folders.append(path)
        else:
            os.close(os.open(path + random.choice(extensions), os.O_CREAT | os.O_WRONLY, 0o644))
PYTHON
}

# seconds COMMAND...: how long it takes.
seconds() {
  local start=$EPOCHREALTIME
  "$@" >&2
  echo "$start $EPOCHREALTIME" | awk '{ printf "%.4f\n", $2 - $1 }'
}

median() { sort -n | awk '{ value[NR] = $1 } END { print value[int((NR + 1) / 2)] }'; }

# in_turns ROUNDS NAME...: calls the functions of these names in turns and keeps their times in NAME.times.
in_turns() {
  local count=$1 round name
  shift
  for name in "$@"; do : >"$work/$name.times"; done
  for ((round = 0; round < count; ++round)); do
    for name in "$@"; do seconds "$name" >>"$work/$name.times"; done
  done
}

# ratio OWN PEER LIMIT [WORDS]: prints the medians of both and their ratio, which is to be at most LIMIT.
ratio() {
  awk -v own="$(median <"$work/$1.times")" -v peer="$(median <"$work/$2.times")" -v name="${1#own_}" -v peer_name="${2#peer_}" \
    -v limit="$3" 'BEGIN {
      ratio = own / peer
      printf "%s %.3f s, %s %.3f s: %.4f (at most %.2f)%s\n", name, own, peer_name, peer, ratio, limit,
        (ratio > limit) ? "  NOT KEPT" : ""
      exit (ratio > limit) }' || kept=1
}

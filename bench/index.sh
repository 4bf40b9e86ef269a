# The update of an index, against updatedb.plocate (which keeps names only), duc (which keeps sizes only) and the desktop's
# own indexer. Each starts without an index of its own. Run by scripts/bench.

indexed=$tree
if [ -z "$indexed" ]; then
  indexed=$work/index-${items:-1000000}
  make_once "$indexed" mixed_tree "$indexed" "${items:-1000000}"
fi

own_update() { rm -rf "$work/cache" && "$programs/norvex_index_bench" "$work/cache" "$indexed" >"$work/update.out"; }
peer_updatedb() {
  rm -f "$work/plocate.db"
  updatedb.plocate -U "$indexed" -o "$work/plocate.db" --require-visibility no --prunepaths "" --prunefs "" --prunenames "" \
    --prune-bind-mounts no
}
peer_duc() { rm -f "$work/duc.db" && duc index -q -d "$work/duc.db" "$indexed"; }

find "$indexed" -size +1000000G >/dev/null # warms the caches
in_turns "${rounds:-5}" own_update peer_updatedb peer_duc
ratio own_update peer_updatedb 1.0
ratio own_update peer_duc 1.3
cat "$work/update.out"

# The desktop's indexer takes milliseconds an item, of which most is waiting: few items, and few rounds.
few=$work/index-10000
make_once "$few" mixed_tree "$few" 10000
own_update_of_few() { rm -rf "$work/cache-few" && "$programs/norvex_index_bench" "$work/cache-few" "$few" >/dev/null; }
# In a home and on a bus of its own, until everything is indexed.
peer_tracker() {
  local home=$work/tracker-home
  rm -rf "$home"
  mkdir -p "$home/run"
  chmod 700 "$home/run"
  env -i PATH="$PATH" LANG=C.UTF-8 HOME="$home" XDG_RUNTIME_DIR="$home/run" GSETTINGS_BACKEND=keyfile \
    dbus-run-session -- bash -c '
      set_option() { gsettings set org.freedesktop.Tracker3.Miner.Files "$@"; }
      set_option index-recursive-directories "[\"$0\"]"
      set_option index-single-directories "[]"
      set_option enable-monitors false
      set_option initial-sleep 0
      exec /usr/libexec/tracker-miner-fs-3 --no-daemon' "$few" >"$work/tracker.log" 2>&1
}
# Whether the indexer has done what it is measured for. It passes over object files, a fifteenth of the files.
check_tracker() {
  local found
  found=$(HOME=$work/tracker-home LANG=C.UTF-8 tracker3 sparql --database "$work/tracker-home/.cache/tracker3/files" \
    -q 'SELECT (COUNT(?f) AS ?n) WHERE { ?f a nfo:FileDataObject }' | awk '/[0-9]/ { print $1 }')
  [ "${found:-0}" -ge 9000 ] || die "the indexer has found ${found:-nothing} of 10,000 items (see $work/tracker.log)"
}
in_turns 3 own_update_of_few peer_tracker
check_tracker
echo "10,000 items:"
ratio own_update_of_few peer_tracker 0.02

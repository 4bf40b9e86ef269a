# The queries of a scan over an index of a million items, as the scan makes them: every match is read, its path and its size
# made. Against one find over the same tree that prints paths and sizes. Run by scripts/bench.

queried=$tree
if [ -z "$queried" ]; then
  queried=$work/index-${items:-1000000}
  make_once "$queried" mixed_tree "$queried" "${items:-1000000}"
fi
rm -rf "$work/cache"
"$programs/norvex_index_bench" "$work/cache" "$queried" >/dev/null

own_queries() { "$programs/norvex_query_bench" "$work/cache" "$queried" >"$work/queries.out"; }
peer_find() { find "$queried" -printf '%p %s\n' >"$work/find.out"; }

peer_find # warms the caches
in_turns "${rounds:-5}" own_queries peer_find
cat "$work/queries.out"

# What both have seen is the same: the images of the tree.
images=$(awk '/public.image/ { print $1 }' "$work/queries.out")
expected=$(find "$queried" -type f \( -name '*.jpg' -o -name '*.png' \) -printf . | wc -c)
[ -n "$tree" ] || [ "$images" -eq "$expected" ] || die "the index has $images images, find has $expected"
ratio own_queries peer_find 0.5

# One query for a type that nothing has, as a scan asks it: the store is open.
for ((round = 0; round < ${rounds:-5}; ++round)); do
  "$programs/norvex_query_bench" "$work/cache" "$queried" "kMDItemContentType == 'type.of.nothing'" |
    awk '/matches in/ { print $4 }'
done | median | awk '{
  printf "a type that nothing has: %.2f ms (at most 5 ms)%s\n", $1 * 1000, ($1 > 0.005) ? "  NOT KEPT" : ""
  exit ($1 > 0.005) }' || kept=1

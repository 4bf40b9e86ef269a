# The agent's walks, as it makes them. Run by scripts/bench.

# even_tree TREE LEVELS: 100 folders in each folder, 100 files in each of the last.
even_tree() {
  python3 - "$@" <<'PYTHON'
import os, sys

def fill(folder, levels):
    os.mkdir(folder)
    for number in range(100):
        name = "%s/item-%03d" % (folder, number)
        if levels:
            fill(name, levels - 1)
        else:
            os.mknod(name)

fill(sys.argv[1], int(sys.argv[2]))
PYTHON
}

# home_tree ITEMS: makes a tree of about as many and names it. About one item in twelve is a folder or a link.
home_tree() {
  make_once "$work/items-$1" "$project/scripts/make-tree" "$work/items-$1" --files $(($1 * 918 / 1000))
  echo "$work/items-$1"
}

tree=$(home_tree "${items:-100000}")
echo "$(count_items "$tree") items"
"$programs/norvex_compare" peers "$programs/norvex_walk" "${rounds:-7}" "$tree" || kept=1

echo
echo "In one process (Google Benchmark):"
NORVEX_BENCH_TREE=$tree "$programs/norvex_walk_benchmark" --benchmark_min_time=1 2>/dev/null | sed -n '4,$p'

# Traced, a walk takes many times as long; what an item costs does not depend on their number.
traced=$(home_tree 100000)
count=$(count_items "$traced")
echo
echo "System calls (strace -f -c norvex_walk size|detail $traced):"
for operation in size detail; do
  strace -f -c -o "$work/calls" "$programs/norvex_walk" "$operation" "$traced" >/dev/null
  awk -v operation="$operation" -v items="$count" '
    $1 ~ /^[0-9.]+$/ && $NF != "total" {
      total += $4
      if ($4 >= items / 50) calls = calls sprintf(", %s %.3f", $NF, $4 / items)
    }
    END { printf "%-7s %.3f an item%s\n", operation, total / items, calls }' "$work/calls"
done

if [ -n "$memory" ]; then
  make_once "$work/even-10000" even_tree "$work/even-10000" 1
  make_once "$work/even-1000000" even_tree "$work/even-1000000" 2
  echo
  echo "Peak memory (norvex_walk size):"
  "$programs/norvex_compare" memory "$programs/norvex_walk" "$work/even-10000" "$work/even-1000000" || kept=1
fi

# The media reader, against a program made with TagLib and against exiftool, over 1,000 files. Run by scripts/bench.

files=$project/build/bench-media
if [ ! -e "$files/manifest.jsonl" ]; then
  rm -rf "$files"
  say "Making 1,000 media files (some 80 MB) ..."
  python3 "$project/scripts/make-media" "$files" --files 1000 --seed 1 >/dev/null
fi
python3 "$project/bench/media.py" "$files" "$programs" || kept=1

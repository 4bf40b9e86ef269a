// The agent's reader of media files, alone: how many of the files that a list names, one path a line, carry a
// purchase date, how many items they have together, and how long that took.
#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <fstream>
#include <string>

#include "platform/linux/Mpeg4MediaReader.h"

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  const norvex::MediaItemKey purchaseDate = std::uint32_t{0x70757264};
  norvex::Mpeg4MediaReader reader;
  std::size_t items = 0;
  std::size_t purchased = 0;
  const auto start = std::chrono::steady_clock::now();
  std::ifstream list(argv[1]);
  for (std::string path; std::getline(list, path);) {
    const auto keys = reader.itemKeys(norvex::Location::file(path));
    items += keys.size();
    purchased += std::find(keys.begin(), keys.end(), purchaseDate) != keys.end() ? 1U : 0U;
  }
  const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - start;
  std::printf("purchased %zu items %zu seconds %.6f\n", purchased, items, taken.count());
  return 0;
}

// The same question as MediaKeys answers, asked of TagLib: how many files carry a purchase date, how many
// items are there. The audio properties, which nobody asks for, are not read.
#include <taglib/mp4file.h>
#include <taglib/mp4tag.h>

#include <chrono>
#include <cstdio>
#include <fstream>
#include <string>

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  std::size_t items = 0;
  std::size_t purchased = 0;
  const auto start = std::chrono::steady_clock::now();
  std::ifstream list(argv[1]);
  for (std::string path; std::getline(list, path);) {
    TagLib::MP4::File file(path.c_str(), false);
    if (!file.isValid() || file.tag() == nullptr) continue;
    items += file.tag()->itemMap().size();
    purchased += file.tag()->contains("purd") ? 1U : 0U;
  }
  const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - start;
  std::printf("purchased %zu items %zu seconds %.6f\n", purchased, items, taken.count());
  return 0;
}

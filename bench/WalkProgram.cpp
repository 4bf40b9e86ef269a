// One walk in a process of its own, to be measured from outside: `norvex_walk size|detail FOLDER`.
#include <cstdio>
#include <string_view>

#include "Walks.h"

using namespace norvex;

namespace {

void printDetail(bench::Roles& roles, const Location& folder) {
  std::uint64_t packages = 0;
  std::uint64_t folders = 0;
  std::uint64_t files = 0;
  std::uint64_t bytes = 0;
  std::uint64_t deepest = 0;
  bench::scanDirectoryInDetail(
      roles, folder, [&](const Location&, std::uint64_t) { ++packages; },
      [&](const Location&, std::uint64_t depth) {
        ++folders;
        deepest = std::max(deepest, depth);
      },
      [&](const Location&, std::uint64_t, std::optional<std::uint64_t> size) {
        ++files;
        bytes += size.value_or(0);
      });
  std::printf("%ju packages, %ju folders, %ju files, %ju bytes, deepest folder %ju\n", packages, folders,
              files, bytes, deepest);
}

}  // namespace

int main(int argc, char** argv) {
  const std::string_view operation = argc == 3 ? argv[1] : "";
  bench::Roles roles;
  if (operation == "size") {
    std::printf("%ju bytes\n", bench::sizeForDirectory(roles, Location::folder(argv[2])));
  } else if (operation == "detail") {
    printDetail(roles, Location::folder(argv[2]));
  } else {
    std::fprintf(stderr, "usage: norvex_walk size|detail FOLDER\n");
    return 2;
  }
  return 0;
}

// One walk in a process of its own, to be measured from outside: norvex_walk size|detail FOLDER
#include <cstdio>
#include <string_view>

#include "MeasuredScanner.h"

int main(int argc, char** argv) {
  const std::string_view operation = argc == 3 ? argv[1] : "";
  if (operation != "size" && operation != "detail") {
    std::fprintf(stderr, "usage: norvex_walk size|detail FOLDER\n");
    return 2;
  }
  norvex::bench::MeasuredScanner scanner;
  const norvex::Location folder = norvex::Location::folder(argv[2]);
  if (operation == "size") {
    std::printf("%ju\n", scanner.sizeOf(folder));
    return 0;
  }
  const auto detail = scanner.detailOf(folder);
  std::printf("%ju packages, %ju folders, %ju files, %ju bytes, %ju levels\n", detail.packages,
              detail.folders, detail.files, detail.bytes, detail.deepest);
  return 0;
}

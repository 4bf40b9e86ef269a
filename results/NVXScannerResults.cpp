#include "results/NVXScannerResults.h"

namespace norvex {
std::string NVXScannerResults::bucketedStringFromSize(std::uint64_t) {
  return "0";
}
std::string NVXScannerResults::bucketedStringFromCount(std::uint64_t) {
  return "0";
}
void NVXScannerResults::logToWendal() const {}
std::string NVXScannerResults::description() const {
  return {};
}
}  // namespace norvex

#include "platform/linux/LinuxSystemControl.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iterator>
#include <string_view>

#include "platform/linux/Files.h"
#include "platform/linux/MachineInfo.h"

namespace norvex {
namespace {

// No model name is nearly as long; one that is cut here does not fit any caller's buffer either.
constexpr std::size_t kLongestFact = 4096;
constexpr std::size_t kLargestMachineInfo = std::size_t{64} * 1024;

constexpr std::string_view kEndings{"\n\r\t \0", 5};

// A fact that is a whole file of the kernel's. Zero-terminated in the device tree, a line elsewhere.
std::string factIn(const std::string& path) {
  const Result<std::string> content = readStartOfFile(path, kLongestFact);
  if (!content) return {};
  std::string fact = content.value().substr(0, content.value().find('\0'));
  fact.erase(fact.find_last_not_of(kEndings) + 1);
  return fact;
}

std::string modelInMachineInfo(const std::string& path) {
  const Result<std::string> content = readStartOfFile(path, kLargestMachineInfo);
  if (!content) return {};
  std::string model = shellVariable(content.value(), "HARDWARE_MODEL");
  model.erase(std::min(model.size(), model.find('\0')));
  model.erase(model.find_last_not_of(kEndings) + 1);
  return model;
}

int fail(int errnoValue) {
  errno = errnoValue;
  return -1;
}

}  // namespace

std::string LinuxSystemControl::hardwareModel() const {
  std::string model = factIn(root_ + "/sys/class/dmi/id/product_name");
  if (model.empty()) model = factIn(root_ + "/sys/firmware/devicetree/base/model");
  if (model.empty()) model = modelInMachineInfo(root_ + "/etc/machine-info");
  return model;
}

int LinuxSystemControl::sysctl(std::span<const int> name, void* buffer, std::size_t* length) {
  if (!std::equal(name.begin(), name.end(), std::begin(kHardwareModelName), std::end(kHardwareModelName))) {
    return fail(ENOENT);
  }
  const std::string model = hardwareModel();
  if (model.empty()) return fail(ENOENT);
  const std::size_t needed = model.size() + 1;
  if (needed > *length) return fail(ENOMEM);
  std::memcpy(buffer, model.c_str(), needed);
  *length = needed;
  return 0;
}

}  // namespace norvex

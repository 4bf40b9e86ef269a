// The one system fact that the agent asks for by number, the hardware model, from where Linux keeps it.
#pragma once

#include <string>
#include <utility>

#include "platform/SystemControl.h"

namespace norvex {

class LinuxSystemControl final : public SystemControl {
 public:
  // `root` stands before every path that is read; the machine's own files are below "".
  explicit LinuxSystemControl(std::string root = "") : root_(std::move(root)) {}

  // Knows kHardwareModelName alone; any other name is ENOENT. The model is the product name of the firmware's
  // tables, else the device tree's model, else HARDWARE_MODEL of /etc/machine-info; a source that cannot be
  // read or says nothing is passed over. Trailing line feeds, zero bytes and blanks are no part of it.
  int sysctl(std::span<const int> name, void* buffer, std::size_t* length) override;

 private:
  std::string hardwareModel() const;

  std::string root_;
};

}  // namespace norvex

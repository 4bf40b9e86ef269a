// Memory pressure as the kernel, or a service manager in its place, reports it: by descriptors that become
// ready.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "platform/MemoryPressureSource.h"
#include "platform/Result.h"
#include "platform/linux/FileDescriptor.h"
#include "platform/linux/PressureSensor.h"

namespace norvex {

class PressureTriggers final : public PressureSensor {
 public:
  // Sets a trigger for each of the levels (see StallLimits.h) on a memory.pressure file. Fails with the errno
  // value when the kernel does not have the file or does not let this user; with EINVAL for a file that is
  // not the kernel's: nothing is written to such a one.
  static Result<std::unique_ptr<PressureSensor>> onFile(const std::string& path, MemoryPressureLevels levels);

  // Listens where the service manager said, after writing there what it said: a file of the kernel's, a FIFO,
  // or a socket. A FIFO is not written to, the text would come back to the reader. Fails as onFile() does.
  static Result<std::unique_ptr<PressureSensor>> onWatch(const std::string& path, const std::string& text);

  std::span<const pollfd> awaited() const override { return awaited_; }
  std::optional<std::chrono::milliseconds> interval() const override { return std::nullopt; }
  PressureVerdict judge(std::span<const pollfd> awaited, Clock::Moment now) override;

 private:
  void add(FileDescriptor file, short events);

  std::vector<FileDescriptor> files_;
  std::vector<pollfd> awaited_;
};

}  // namespace norvex

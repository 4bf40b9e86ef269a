#include "ChildProcess.h"

#include <fcntl.h>
#include <grp.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <system_error>

#include "platform/FileDescriptor.h"
#include "platform/linux/Files.h"

namespace norvex {
namespace {

std::string impossible(const std::string& step) {
  return kImpossible + step + ": " + std::generic_category().message(errno);
}

bool writeLine(const std::string& path, const std::string& text) {
  const FileDescriptor file(::open(path.c_str(), O_WRONLY | O_CLOEXEC));
  return file && writeAll(file.number(), text) == 0;
}

// Root in a user namespace of its own may mount.
bool becomeRootOfNamespace(unsigned user, unsigned group) {
  return writeLine("/proc/self/uid_map", "0 " + std::to_string(user) + " 1") &&
         writeLine("/proc/self/setgroups", "deny") &&
         writeLine("/proc/self/gid_map", "0 " + std::to_string(group) + " 1");
}

}  // namespace

ChildEnd inChild(const std::function<std::string()>& body) {
  int ends[2] = {};
  if (::pipe2(ends, O_CLOEXEC) != 0) std::abort();
  FileDescriptor readEnd(ends[0]);
  FileDescriptor writeEnd(ends[1]);
  const pid_t child = ::fork();
  if (child < 0) std::abort();
  if (child == 0) {
    const std::string report = body();
    writeAll(writeEnd.number(), report);
    ::_exit(0);
  }
  writeEnd = FileDescriptor();
  ChildEnd end;
  char buffer[4096];
  ssize_t count = 0;
  while ((count = ::read(readEnd.number(), buffer, sizeof(buffer))) > 0) {
    end.report.append(buffer, static_cast<std::size_t>(count));
  }
  ::waitpid(child, &end.status, 0);
  return end;
}

std::string enterPrivateMounts() {
  const unsigned user = ::geteuid();
  const unsigned group = ::getegid();
  const bool isRoot = user == 0;
  if (::unshare(isRoot ? CLONE_NEWNS : CLONE_NEWNS | CLONE_NEWUSER) != 0) return impossible("unshare");
  if (!isRoot && !becomeRootOfNamespace(user, group)) return impossible("uid_map");
  if (::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) return impossible("private mounts");
  return "";
}

std::string mountSmallDisk(const std::string& folder, const std::string& size) {
  std::string problem = enterPrivateMounts();
  if (!problem.empty()) return problem;
  const std::string options = "size=" + size;
  if (::mount("tmpfs", folder.c_str(), "tmpfs", 0, options.c_str()) != 0) return impossible("mount");
  return "";
}

bool becomeUnprivileged() {
  if (::geteuid() != 0) return true;
  return ::setgroups(0, nullptr) == 0 && ::setgid(kUnprivilegedId) == 0 && ::setuid(kUnprivilegedId) == 0;
}

}  // namespace norvex

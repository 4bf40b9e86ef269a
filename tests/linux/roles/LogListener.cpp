#include "LogListener.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/socket.h>
#include <sys/un.h>

#include <array>
#include <cstdlib>
#include <cstring>
#include <vector>

namespace norvex {
namespace {

sockaddr_un addressOf(const std::string& path) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof(address.sun_path)) std::abort();
  std::memcpy(address.sun_path, path.c_str(), path.size());
  return address;
}

std::string contentOfSealed(int memory) {
  constexpr int kWanted = F_SEAL_SHRINK | F_SEAL_GROW | F_SEAL_WRITE | F_SEAL_SEAL;
  if (::fcntl(memory, F_GET_SEALS) != kWanted) return "(not sealed)";
  std::string content(static_cast<std::size_t>(::lseek(memory, 0, SEEK_END)), '\0');
  if (::pread(memory, content.data(), content.size(), 0) != static_cast<ssize_t>(content.size()))
    std::abort();
  return content;
}

}  // namespace

LogListener::LogListener(const std::string& path) : socket_(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0)) {
  const sockaddr_un address = addressOf(path);
  if (::bind(socket_.number(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) != 0)
    std::abort();
}

std::string LogListener::next() {
  std::vector<char> buffer(1024 * 1024);
  iovec content{buffer.data(), buffer.size()};
  alignas(cmsghdr) std::array<char, 256> control{};
  msghdr header{};
  header.msg_iov = &content;
  header.msg_iovlen = 1;
  header.msg_control = control.data();
  header.msg_controllen = control.size();
  const ssize_t count = ::recvmsg(socket_.number(), &header, MSG_DONTWAIT | MSG_CMSG_CLOEXEC);
  if (count < 0) return "(nothing)";
  const cmsghdr* sent = CMSG_FIRSTHDR(&header);
  cameSealed_ = sent != nullptr && sent->cmsg_type == SCM_RIGHTS;
  if (!cameSealed_) return {buffer.data(), static_cast<std::size_t>(count)};
  int memory = -1;
  std::memcpy(&memory, CMSG_DATA(sent), sizeof(memory));
  return contentOfSealed(FileDescriptor(memory).number());
}

void LogListener::fill(const std::string& path) {
  const sockaddr_un address = addressOf(path);
  // Each sender has a buffer of its own; the queue is what they share.
  std::vector<FileDescriptor> senders;
  ssize_t sent = 0;
  while (sent >= 0) {
    senders.emplace_back(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    sent = ::sendto(senders.back().number(), "x", 1, MSG_DONTWAIT,
                    reinterpret_cast<const sockaddr*>(&address), sizeof(address));
  }
}

}  // namespace norvex

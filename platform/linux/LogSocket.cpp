#include "platform/linux/LogSocket.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/mman.h>
#include <sys/socket.h>
#include <sys/un.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>

#include "platform/FileDescriptor.h"
#include "platform/linux/Files.h"

namespace norvex {
namespace {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

// Nothing of the content can be changed by us any more: its reader may map it.
constexpr int kAllSeals = F_SEAL_SHRINK | F_SEAL_GROW | F_SEAL_WRITE | F_SEAL_SEAL;

int connectTo(const std::string& path, FileDescriptor& socket) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof(address.sun_path)) return ENAMETOOLONG;
  std::copy(path.begin(), path.end(), std::begin(address.sun_path));
  socket = FileDescriptor(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
  if (!socket) return errno;
  if (::connect(socket.number(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) != 0) {
    return errno;
  }
  return 0;
}

// Waits until the other end's queue may have room again. False when the moment has come first.
bool waitForRoom(int socket, steady_clock::time_point deadline) {
  while (true) {
    const auto left = std::chrono::ceil<milliseconds>(deadline - steady_clock::now());
    if (left <= milliseconds::zero()) return false;
    pollfd room{socket, POLLOUT, 0};
    const int count = ::poll(&room, 1, static_cast<int>(left.count()));
    if (count > 0) return true;
    if (count < 0 && errno != EINTR) return false;
  }
}

}  // namespace

int LogSocket::send(std::string_view message) {
  iovec content{const_cast<char*>(message.data()), message.size()};
  msghdr header{};
  header.msg_iov = &content;
  header.msg_iovlen = 1;
  return sendWithin(header);
}

int LogSocket::sendSealed(std::string_view message) {
  const FileDescriptor memory(::memfd_create("message", MFD_CLOEXEC | MFD_ALLOW_SEALING));
  if (!memory) return errno;
  if (const int error = writeAll(memory.number(), message)) return error;
  if (::fcntl(memory.number(), F_ADD_SEALS, kAllSeals) != 0) return errno;

  const int number = memory.number();
  alignas(cmsghdr) std::array<char, CMSG_SPACE(sizeof(number))> control{};
  msghdr header{};
  header.msg_control = control.data();
  header.msg_controllen = control.size();
  cmsghdr* descriptor = CMSG_FIRSTHDR(&header);
  descriptor->cmsg_level = SOL_SOCKET;
  descriptor->cmsg_type = SCM_RIGHTS;
  descriptor->cmsg_len = CMSG_LEN(sizeof(number));
  std::memcpy(CMSG_DATA(descriptor), &number, sizeof(number));
  return sendWithin(header);
}

int LogSocket::sendWithin(const msghdr& header) {
  FileDescriptor socket;
  if (const int error = connectTo(path_, socket)) return error;
  const auto deadline = steady_clock::now() + (gaveUp_ ? milliseconds::zero() : sendLimit_);
  while (::sendmsg(socket.number(), &header, MSG_NOSIGNAL) < 0) {
    const int error = errno;
    if (error == EINTR) continue;
    if (error != EAGAIN) return error;
    if (!waitForRoom(socket.number(), deadline)) {
      gaveUp_ = true;
      return ETIMEDOUT;
    }
  }
  gaveUp_ = false;
  return 0;
}

}  // namespace norvex

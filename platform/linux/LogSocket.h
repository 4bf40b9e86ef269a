// The socket of a logging service, written to for a limited time: a service that is stopped takes messages
// until its queue is full, and then lets whoever writes wait for ever.
//
// Any thread; the object keeps no connection between messages, so that it does not matter when the service is
// started anew.
#pragma once

#include <atomic>
#include <chrono>
#include <string>
#include <string_view>

struct msghdr;

namespace norvex {

class LogSocket {
 public:
  static constexpr std::chrono::milliseconds kSendLimit{2000};

  // `path` is that of a datagram socket; it need not be there.
  explicit LogSocket(std::string path, std::chrono::milliseconds sendLimit = kSendLimit)
      : path_(std::move(path)), sendLimit_(sendLimit) {}

  // Hands over one message as one datagram. 0 when the service has it in its queue; else the errno value:
  // ENOENT or ECONNREFUSED where no service listens, EMSGSIZE when it is too large for a datagram, ETIMEDOUT
  // when the queue was full until the limit. Who has waited that long once is not made to wait again: while
  // the queue stays full, later messages fail at once.
  int send(std::string_view message);

  // The same, with the message in memory that cannot be changed any more and whose descriptor is sent in its
  // place. For services that take it: the journal. Of any size.
  int sendSealed(std::string_view message);

 private:
  int sendWithin(const msghdr& header);

  std::string path_;
  std::chrono::milliseconds sendLimit_;
  std::atomic<bool> gaveUp_ = false;
};

}  // namespace norvex

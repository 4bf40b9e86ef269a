#include <gtest/gtest.h>

#include <thread>

#include "LogListener.h"
#include "ScratchFolder.h"
#include "platform/linux/LogSocket.h"

namespace norvex {
namespace {

TEST(LogSocket, AMessageThatWaitsGoesAsSoonAsThereIsRoom) {
  const ScratchFolder folder;
  LogListener listener(folder.at("log"));
  listener.fill(folder.at("log"));
  LogSocket socket(folder.at("log"), std::chrono::minutes(5));
  int outcome = -1;
  std::thread writer([&] { outcome = socket.send("waited"); });
  // What the queue holds before it comes first, however long the writer takes to get going.
  while (listener.next() != "waited") std::this_thread::yield();
  writer.join();
  EXPECT_EQ(outcome, 0);
}

}  // namespace
}  // namespace norvex

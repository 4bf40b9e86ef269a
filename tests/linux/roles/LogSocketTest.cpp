#include "platform/linux/LogSocket.h"

#include <gtest/gtest.h>

#include <cerrno>

#include "LogListener.h"
#include "ScratchFolder.h"

namespace norvex {
namespace {

using std::chrono::steady_clock;

constexpr std::chrono::milliseconds kShortLimit{50};
constexpr std::chrono::seconds kLong{60};

TEST(LogSocket, HandsOverOneDatagramAMessage) {
  const ScratchFolder folder;
  LogListener listener(folder.at("log"));
  LogSocket socket(folder.at("log"));
  const std::string bytes("a\0b\nc", 5);
  EXPECT_EQ(socket.send(bytes), 0);
  EXPECT_EQ(socket.send("second"), 0);
  EXPECT_EQ(listener.next(), bytes);
  EXPECT_EQ(listener.next(), "second");
  EXPECT_EQ(listener.next(), "(nothing)");
}

TEST(LogSocket, AMessageTooLargeForADatagramGoesSealed) {
  const ScratchFolder folder;
  LogListener listener(folder.at("log"));
  LogSocket socket(folder.at("log"));
  const std::string large(4'000'000, 'x');
  EXPECT_EQ(socket.send(large), EMSGSIZE);
  EXPECT_EQ(socket.sendSealed(large), 0);
  EXPECT_EQ(listener.next(), large);
  EXPECT_TRUE(listener.cameSealed());
  EXPECT_EQ(listener.next(), "(nothing)");
}

TEST(LogSocket, WhereNobodyListensItSaysSoAtOnce) {
  const ScratchFolder folder;
  LogSocket socket(folder.at("log"), kLong);
  EXPECT_EQ(socket.send("x"), ENOENT);
  { const LogListener gone(folder.at("log")); }
  EXPECT_EQ(socket.send("x"), ECONNREFUSED);
  std::filesystem::remove(folder.at("log"));
  folder.write("log", "a file");
  EXPECT_EQ(socket.send("x"), ECONNREFUSED);
  EXPECT_EQ(LogSocket(std::string(200, 'x')).send("x"), ENAMETOOLONG);
}

TEST(LogSocket, AServiceThatIsStoppedIsWaitedForOnce) {
  const ScratchFolder folder;
  LogListener listener(folder.at("log"));
  listener.fill(folder.at("log"));
  LogSocket socket(folder.at("log"), kShortLimit);
  const auto start = steady_clock::now();
  EXPECT_EQ(socket.send("x"), ETIMEDOUT);
  EXPECT_GE(steady_clock::now() - start, kShortLimit);

  const auto second = steady_clock::now();
  for (int message = 0; message < 1000; ++message) EXPECT_EQ(socket.send("x"), ETIMEDOUT);
  EXPECT_LT(steady_clock::now() - second, 1000 * kShortLimit);
}

TEST(LogSocket, AServiceThatGoesOnIsWrittenToAgain) {
  const ScratchFolder folder;
  LogListener listener(folder.at("log"));
  listener.fill(folder.at("log"));
  LogSocket socket(folder.at("log"), kShortLimit);
  EXPECT_EQ(socket.send("lost"), ETIMEDOUT);
  while (listener.next() != "(nothing)") {
  }
  EXPECT_EQ(socket.send("arrives"), 0);
  EXPECT_EQ(listener.next(), "arrives");
}

}  // namespace
}  // namespace norvex

// The way to the bus, where there is none or a bad one. What a real manager says is tested in a session.
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/un.h>

#include <cerrno>
#include <chrono>
#include <cstring>

#include "ScratchFolder.h"
#include "platform/FileDescriptor.h"
#include "platform/linux/UserManagerJobRegistry.h"

namespace norvex {
namespace {

Error errorOf(const Environment& environment,
              std::chrono::milliseconds limit = std::chrono::milliseconds(100)) {
  const Result<void> outcome =
      UserManagerJobRegistry(environment, limit).disableJob(JobDomain::user, "com.brixo.NorvexAgent");
  return outcome ? Error{} : outcome.error();
}

// A socket that takes connections in and says nothing.
FileDescriptor silentBus(const std::string& path) {
  FileDescriptor listener(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::strncpy(address.sun_path, path.c_str(), sizeof(address.sun_path) - 1);
  EXPECT_EQ(::bind(listener.number(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)), 0);
  EXPECT_EQ(::listen(listener.number(), 4), 0);
  return listener;
}

TEST(UserManagerConnection, WithoutABusInTheEnvironmentThereIsNoMedium) {
  for (const Environment& environment :
       {Environment{}, Environment{{"XDG_RUNTIME_DIR", ""}}, Environment{{"DBUS_SESSION_BUS_ADDRESS", ""}}}) {
    const Error error = errorOf(environment);
    EXPECT_EQ(error.code, ENOMEDIUM);
    EXPECT_EQ(error.description, "Session bus: No medium found");
  }
}

TEST(UserManagerConnection, WhereNobodyListensTheSystemSaysSo) {
  const ScratchFolder folder;
  EXPECT_EQ(errorOf({{"XDG_RUNTIME_DIR", folder.path()}}).description,
            "Session bus: No such file or directory");
  EXPECT_EQ(errorOf({{"DBUS_SESSION_BUS_ADDRESS", "unix:path=" + folder.at("none")}}).code, ENOENT);
  silentBus(folder.at("bus"));  // closed again: the socket's file stays
  EXPECT_EQ(errorOf({{"XDG_RUNTIME_DIR", folder.path()}}).code, ECONNREFUSED);
}

TEST(UserManagerConnection, AnAddressThatIsNoneIsAFailure) {
  for (const char* address : {"nonsense", "unix:", "unix:path=%zz", ";;;"}) {
    EXPECT_NE(errorOf({{"DBUS_SESSION_BUS_ADDRESS", address}}).code, 0) << address;
  }
}

TEST(UserManagerConnection, ABusThatSaysNothingIsGivenUpOn) {
  const ScratchFolder folder;
  std::filesystem::create_directory(folder.at("run = 1;"));
  const FileDescriptor bus = silentBus(folder.at("run = 1;/bus"));
  const auto start = std::chrono::steady_clock::now();
  const Error error = errorOf({{"XDG_RUNTIME_DIR", folder.at("run = 1;")}});
  // The library by itself would give up after a minute and a half.
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(10));
  EXPECT_EQ(error.code, ETIMEDOUT);
  EXPECT_EQ(error.description, "Session bus: Connection timed out");
}

}  // namespace
}  // namespace norvex

#include "TestVolume.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <sqlite3.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "index/StoreSeal.h"

namespace norvex {
namespace {

std::string makeBase() {
  std::string pattern = (std::filesystem::temp_directory_path() / "norvex-store-XXXXXX").string();
  if (::mkdtemp(pattern.data()) == nullptr) std::abort();
  return pattern;
}

const std::atomic<bool> kNotCancelled{false};

void writeMap(const char* path, const std::string& text) {
  std::ofstream(path) << text;
}

}  // namespace

TestVolume::TestVolume() : base_(makeBase()), root_(base_ + "/volume"), stores_(base_ + "/cache/norvex") {
  std::filesystem::create_directories(root_);
}

TestVolume::~TestVolume() {
  // Not by std::filesystem: it builds whole paths, which the deepest trees here exceed.
  const std::string command = "chmod -R u+rwx '" + base_ + "' 2>/dev/null; rm -rf '" + base_ + "'";
  if (std::system(command.c_str()) != 0) ADD_FAILURE() << "cannot remove " << base_;
}

void TestVolume::folder(std::string_view path) const {
  std::filesystem::create_directories(at(path));
}

void TestVolume::file(std::string_view path, std::string_view content) const {
  std::filesystem::create_directories(std::filesystem::path(at(path)).parent_path());
  std::ofstream(at(path), std::ios::binary) << content;
}

void TestVolume::link(std::string_view path, std::string_view target) const {
  std::filesystem::create_directories(std::filesystem::path(at(path)).parent_path());
  std::filesystem::create_symlink(target, at(path));
}

bool TestVolume::attribute(std::string_view path, const char* name, std::string_view value) const {
  return ::lsetxattr(at(path).c_str(), name, value.data(), value.size(), 0) == 0;
}

const CrawlRules& TestVolume::rules() {
  static const CrawlRules kRules(ContentTypes::load({}), "/nonexistent");
  return kRules;
}

Result<IndexUpdateSummary> TestVolume::update(const IndexUpdateOptions& options) const {
  return updateIndex(stores_, root_, rules(), options, kNotCancelled);
}

std::vector<std::string> TestVolume::paths() const {
  auto reader = open();
  if (!reader) return {reader.error().description};
  auto statement = reader.value()->prepare("SELECT path_of(id) FROM items WHERE id > 1 ORDER BY id");
  if (!statement) return {statement.error().description};
  std::vector<std::string> found;
  int status = SQLITE_ROW;
  while ((status = sqlite3_step(statement.value().get())) == SQLITE_ROW) {
    found.push_back(std::string(storeBytes(statement.value().get(), 0)).substr(root_.size() + 1));
  }
  if (status != SQLITE_DONE) found.push_back(reader.value()->lastError().description);
  return found;
}

void TestVolume::tamper(const char* sql) const {
  struct stat before {};
  ASSERT_EQ(::stat(storePath().c_str(), &before), 0);
  ASSERT_EQ(::truncate(storePath().c_str(), before.st_size - static_cast<off_t>(kStoreSealBytes)), 0);
  sqlite3* connection = nullptr;
  ASSERT_EQ(sqlite3_open(storePath().c_str(), &connection), SQLITE_OK);
  char* message = nullptr;
  EXPECT_EQ(sqlite3_exec(connection, sql, nullptr, nullptr, &message), SQLITE_OK) << message;
  sqlite3_free(message);
  sqlite3_close(connection);
  const FileDescriptor file(::open(storePath().c_str(), O_RDWR | O_CLOEXEC));
  ASSERT_TRUE(sealStore(file.number()).ok());
}

std::string told(const std::optional<MetadataValue>& value) {
  if (!value) return "none";
  if (const auto* text = std::get_if<std::string>(&*value)) return "text " + *text;
  if (const auto* whole = std::get_if<std::int64_t>(&*value)) return "whole number " + std::to_string(*whole);
  if (const auto* real = std::get_if<double>(&*value)) return "number " + std::to_string(*real);
  return "another kind of value";
}

ChildEnd inChild(const std::function<int()>& body) {
  std::fflush(nullptr);
  const pid_t child = ::fork();
  if (child == 0) ::_exit(body());
  ChildEnd end;
  if (child < 0 || ::waitpid(child, &end.status, 0) != child) end.status = -1;
  return end;
}

bool enterOwnMounts() {
  const std::string user = std::to_string(::geteuid()), group = std::to_string(::getegid());
  if (::geteuid() == 0) {
    if (::unshare(CLONE_NEWNS) != 0) return false;
  } else {
    if (::unshare(CLONE_NEWUSER | CLONE_NEWNS) != 0) return false;
    writeMap("/proc/self/setgroups", "deny");
    writeMap("/proc/self/uid_map", "0 " + user + " 1");
    writeMap("/proc/self/gid_map", "0 " + group + " 1");
  }
  return ::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0;
}

}  // namespace norvex

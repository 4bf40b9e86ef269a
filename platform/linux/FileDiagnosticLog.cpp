#include "platform/linux/FileDiagnosticLog.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <utility>

#include "platform/FileDescriptor.h"
#include "platform/linux/DiagnosticMessageText.h"
#include "platform/linux/Files.h"

namespace norvex {
namespace {

// Below the state folder.
constexpr const char* kFolder = "/norvex";
constexpr const char* kFile = "/diagnostics.jsonl";

constexpr mode_t kPrivateFileMode = 0600;

// Another writer needs milliseconds. Whoever holds the lock for longer is stopped, and must not stop us.
constexpr std::chrono::milliseconds kLockLimit{2000};

// RFC 3339 in UTC, whole seconds.
std::string timeText(std::chrono::system_clock::time_point moment) {
  using namespace std::chrono;
  const auto second = floor<seconds>(moment);
  const auto day = floor<days>(second);
  const year_month_day date(day);
  const hh_mm_ss time(second - day);
  std::array<char, 64> text{};
  std::snprintf(text.data(), text.size(), "%04d-%02u-%02uT%02d:%02d:%02dZ", static_cast<int>(date.year()),
                static_cast<unsigned>(date.month()), static_cast<unsigned>(date.day()),
                static_cast<int>(time.hours().count()), static_cast<int>(time.minutes().count()),
                static_cast<int>(time.seconds().count()));
  return text.data();
}

bool endsInsideLine(int file, off_t size) {
  char last = '\n';
  return size > 0 && ::pread(file, &last, 1, size - 1) == 1 && last != '\n';
}

// A file that cannot even be shortened keeps a torn line, which the next message ends.
void takeBackTo(off_t size, int file) {
  const bool shortened = ::ftruncate(file, size) == 0;
  static_cast<void>(shortened);
}

ssize_t writeOnce(int file, const std::string& text) {
  ssize_t written = 0;
  do {
    written = ::write(file, text.data(), text.size());
  } while (written < 0 && errno == EINTR);
  return written;
}

}  // namespace

std::string FileDiagnosticLog::pathBelow(const std::string& stateFolder) {
  return stateFolder + kFolder + kFile;
}

FileDiagnosticLog::FileDiagnosticLog(const std::string& stateFolder, WallClock now)
    : folder_(stateFolder + kFolder), path_(pathBelow(stateFolder)), now_(std::move(now)) {}

void FileDiagnosticLog::logWithKeys(std::string_view domain, int level,
                                    std::span<const DiagnosticPair> pairs) {
  append(diagnosticMessageJson(domain, level, pairs, timeText(now_())) + '\n');
}

void FileDiagnosticLog::append(std::string line) {
  if (makePrivateFolders(folder_) != 0) return;
  const FileDescriptor file(
      ::open(path_.c_str(), O_RDWR | O_APPEND | O_CREAT | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY,
             kPrivateFileMode));
  if (!file) return;
  // Without the lock the line is written all the same, in one call and so in one piece. Only taking it back
  // is left out then: it could take another writer's line along.
  const bool locked = lockWithin(file.number(), kLockLimit);
  struct stat status {};
  if (::fstat(file.number(), &status) != 0 || !S_ISREG(status.st_mode)) return;

  if (endsInsideLine(file.number(), status.st_size)) line.insert(line.begin(), '\n');
  const ssize_t written = writeOnce(file.number(), line);
  if (written != static_cast<ssize_t>(line.size())) {
    if (locked && written > 0) takeBackTo(status.st_size, file.number());
    return;
  }
  ::fsync(file.number());
  syncFolder(folder_);
}

}  // namespace norvex

#include "index/StoreSeal.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <bit>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <span>
#include <system_error>
#include <thread>
#include <vector>

#include "index/StoreDatabase.h"

namespace norvex {
namespace {

constexpr std::uint64_t kMagic = 0x324C414553585653;  // "SVXSEAL2"
constexpr std::size_t kReadBytes = std::size_t{256}
                                   << 10U;  // stays in the second-level cache between read and sum

// Four independent lanes of multiply and rotate: as fast as memory is read. Each step is a bijection of its
// lane, so a change of any one word always changes the sum.
class Checksum {
 public:
  // Every piece but the last has a multiple of 32 bytes.
  void add(std::span<const std::byte> bytes) {
    for (; bytes.size() >= sizeof lanes_; bytes = bytes.subspan(sizeof lanes_)) addBlock(bytes.data());
    if (bytes.empty()) return;
    std::array<std::byte, sizeof lanes_> padded{};
    std::copy(bytes.begin(), bytes.end(), padded.begin());
    addBlock(padded.data());
  }

  std::uint64_t value() const {
    std::uint64_t sum = 0;
    for (const std::uint64_t lane : lanes_) sum = (std::rotl(sum, 29) + lane) * kPrime;
    return sum;
  }

 private:
  static constexpr std::uint64_t kPrime = 0x9E3779B97F4A7C15;

  void addBlock(const std::byte* block) {
    for (std::size_t lane = 0; lane < lanes_.size(); ++lane) {
      std::uint64_t word = 0;
      std::memcpy(&word, block + lane * sizeof word, sizeof word);
      lanes_[lane] = std::rotl((lanes_[lane] ^ word) * kPrime, 31);
    }
  }

  std::array<std::uint64_t, 4> lanes_{1, 2, 3, 4};
};

struct Seal {
  std::uint64_t magic = kMagic;
  std::uint64_t length = 0;
  std::uint64_t checksum = 0;
};
static_assert(sizeof(Seal) == kStoreSealBytes);

Error damaged() {
  return damagedStore("its bytes have changed");
}

bool readFully(int fd, std::span<std::byte> bytes, std::uint64_t offset) {
  while (!bytes.empty()) {
    const ssize_t count = ::pread(fd, bytes.data(), bytes.size(), static_cast<off_t>(offset));
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return false;
    bytes = bytes.subspan(static_cast<std::size_t>(count));
    offset += static_cast<std::uint64_t>(count);
  }
  return true;
}

// The checksum of a file: that of the checksums of its pieces, which are read on all processors at once.
class FileChecksum {
 public:
  FileChecksum(int fd, std::uint64_t length)
      : fd_(fd),
        length_(length),
        pieces_(static_cast<std::size_t>((length + kPieceBytes - 1) / kPieceBytes)) {}

  Result<std::uint64_t> value() {
    std::vector<std::thread> helpers;
    const std::size_t threads = std::min<std::size_t>(std::thread::hardware_concurrency(), pieces_.size());
    try {
      while (helpers.size() + 1 < threads) helpers.emplace_back([this] { sumPieces(); });
    } catch (const std::system_error&) {
      // No more threads to be had: those that there are do it.
    }
    sumPieces();
    for (std::thread& helper : helpers) helper.join();
    if (hasFailed_) return damaged();
    Checksum whole;
    whole.add(std::as_bytes(std::span(pieces_)));
    return whole.value();
  }

 private:
  static constexpr std::uint64_t kPieceBytes = std::uint64_t{2} << 20U;

  void sumPieces() {
    std::vector<std::byte> buffer(kReadBytes);
    for (std::size_t piece = next_++; piece < pieces_.size() && !hasFailed_; piece = next_++) {
      if (!sumPiece(piece, buffer)) hasFailed_ = true;
    }
  }

  bool sumPiece(std::size_t piece, std::span<std::byte> buffer) {
    Checksum checksum;
    const std::uint64_t begin = piece * kPieceBytes;
    const std::uint64_t end = std::min(begin + kPieceBytes, length_);
    for (std::uint64_t offset = begin; offset < end;) {
      const std::span<std::byte> part = buffer.first(std::min<std::uint64_t>(buffer.size(), end - offset));
      if (!readFully(fd_, part, offset)) return false;
      checksum.add(part);
      offset += part.size();
    }
    pieces_[piece] = checksum.value();
    return true;
  }

  const int fd_;
  const std::uint64_t length_;
  std::vector<std::uint64_t> pieces_;
  std::atomic<std::size_t> next_{0};
  std::atomic<bool> hasFailed_{false};
};

}  // namespace

Result<void> sealStore(int fd) {
  struct stat status {};
  if (::fstat(fd, &status) != 0) return systemError(errno);
  Seal seal;
  seal.length = static_cast<std::uint64_t>(status.st_size);
  const Result<std::uint64_t> checksum = FileChecksum(fd, seal.length).value();
  if (!checksum) return checksum.error();
  seal.checksum = checksum.value();
  const ssize_t written = ::pwrite(fd, &seal, sizeof seal, status.st_size);
  if (written < 0) return systemError(errno);
  if (static_cast<std::size_t>(written) != sizeof seal) return systemError(ENOSPC);
  return {};
}

Result<void> checkStoreSeal(int fd) {
  struct stat status {};
  if (::fstat(fd, &status) != 0) return systemError(errno);
  const auto size = static_cast<std::uint64_t>(status.st_size);
  if (size < kStoreSealBytes) return damaged();
  Seal seal;
  const std::uint64_t length = size - kStoreSealBytes;
  if (!readFully(fd, std::as_writable_bytes(std::span(&seal, 1)), length)) return damaged();
  if (seal.magic != kMagic || seal.length != length) return damaged();
  const Result<std::uint64_t> checksum = FileChecksum(fd, length).value();
  if (!checksum) return checksum.error();
  if (checksum.value() != seal.checksum) return damaged();
  return {};
}

}  // namespace norvex

#include "index/StoreSeal.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cerrno>
#include <cstring>
#include <vector>

#include "index/StoreDatabase.h"

namespace norvex {
namespace {

constexpr std::uint64_t kMagic = 0x314C414553585653;  // "SVXSEAL1"
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

Result<std::uint64_t> checksumOf(std::uint64_t length, const StoreByteReader& read) {
  std::vector<std::byte> buffer(kReadBytes);
  Checksum checksum;
  for (std::uint64_t offset = 0; offset < length;) {
    const std::size_t size = static_cast<std::size_t>(std::min<std::uint64_t>(kReadBytes, length - offset));
    const std::span<std::byte> piece(buffer.data(), size);
    if (!read(piece, offset)) return damaged();
    checksum.add(piece);
    offset += size;
  }
  return checksum.value();
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

}  // namespace

Result<void> sealStore(int fd) {
  struct stat status {};
  if (::fstat(fd, &status) != 0) return systemError(errno);
  Seal seal;
  seal.length = static_cast<std::uint64_t>(status.st_size);
  const auto read = [fd](std::span<std::byte> bytes, std::uint64_t offset) {
    return readFully(fd, bytes, offset);
  };
  const Result<std::uint64_t> checksum = checksumOf(seal.length, read);
  if (!checksum) return checksum.error();
  seal.checksum = checksum.value();
  const ssize_t written = ::pwrite(fd, &seal, sizeof seal, status.st_size);
  if (written < 0) return systemError(errno);
  if (static_cast<std::size_t>(written) != sizeof seal) return systemError(ENOSPC);
  return {};
}

Result<void> checkStoreSeal(std::uint64_t fileSize, const StoreByteReader& read) {
  if (fileSize < kStoreSealBytes) return damaged();
  Seal seal;
  const std::uint64_t length = fileSize - kStoreSealBytes;
  if (!read(std::as_writable_bytes(std::span(&seal, 1)), length)) return damaged();
  if (seal.magic != kMagic || seal.length != length) return damaged();
  const Result<std::uint64_t> checksum = checksumOf(length, read);
  if (!checksum) return checksum.error();
  if (checksum.value() != seal.checksum) return damaged();
  return {};
}

}  // namespace norvex

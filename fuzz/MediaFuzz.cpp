// Feeds any bytes to the media reader. Beyond what the sanitizers see, it must stay within its share of the
// file and of memory, and a file must yield the same keys when it is read again.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <span>
#include <string_view>
#include <variant>

#include "platform/linux/BoxReader.h"
#include "platform/linux/MediaItemList.h"

namespace {

// The input as a file that has zeros behind it up to a size of any magnitude, as a sparse file has.
class InputSource final : public norvex::ByteSource {
 public:
  InputSource(std::string_view bytes, std::uint64_t zerosBehind) : bytes_(bytes), zerosBehind_(zerosBehind) {}

  std::uint64_t size() const override { return bytes_.size() + zerosBehind_; }

  std::size_t read(std::uint64_t offset, std::span<char> buffer) override {
    if (offset >= size()) return 0;
    const auto length = static_cast<std::size_t>(std::min<std::uint64_t>(size() - offset, buffer.size()));
    std::fill_n(buffer.begin(), length, '\0');
    if (offset < bytes_.size()) bytes_.copy(buffer.data(), length, static_cast<std::size_t>(offset));
    asked_ += length;
    return length;
  }

  std::size_t asked() const { return asked_; }

 private:
  std::string_view bytes_;
  std::uint64_t zerosBehind_;
  std::size_t asked_ = 0;
};

void require(bool holds) {
  if (!holds) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  std::string_view input(reinterpret_cast<const char*>(data), size);
  // The last byte, where no box needs it, chooses how many zeros stand behind the others: none, or up to as
  // many as a 64-bit size can tell.
  std::uint64_t zerosBehind = 0;
  if (!input.empty()) {
    const unsigned magnitude = static_cast<unsigned char>(input.back()) % 65U;
    input.remove_suffix(1);
    if (magnitude > 0)
      zerosBehind = (UINT64_MAX >> (64U - magnitude)) - input.size() * (magnitude == 64U ? 1U : 0U);
  }
  InputSource source(input, zerosBehind);
  const auto keys = norvex::mediaItemKeys(source);

  require(source.asked() <= norvex::BoxReader::maxBytesRead);
  require(keys.size() <= norvex::maxMediaItems);
  for (const auto& key : keys) {
    const auto* text = std::get_if<std::string>(&key);
    require(text == nullptr || text->size() <= 2 * norvex::maxMediaKeyPart + 1);
  }
  InputSource again(input, zerosBehind);
  require(norvex::mediaItemKeys(again) == keys);
  return 0;
}

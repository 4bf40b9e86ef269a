#include "platform/linux/SilentMemoryPressureSource.h"

namespace norvex {
namespace {

class NoEvents final : public MemoryPressureEvents {
 public:
  void setHandler(std::function<void()>) override {}
  void resume() override {}
};

}  // namespace

std::unique_ptr<MemoryPressureEvents> SilentMemoryPressureSource::create(MemoryPressureLevels) {
  return std::make_unique<NoEvents>();
}

}  // namespace norvex

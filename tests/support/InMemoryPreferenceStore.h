// Preferences in two layers, as a process that may be killed sees them: what has been set, and what would be
// there after a restart.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <string>

#include "platform/PreferenceStore.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryPreferenceStore final : public PreferenceStore {
 public:
  using Domains = std::map<std::string, std::map<std::string, double>>;

  explicit InMemoryPreferenceStore(CallJournal& calls) : calls_(calls) {}

  std::optional<double> copyValue(const std::string& key, const std::string& domain) override {
    calls_.add("copyValue " + key);
    const std::optional<double> value = in(pending, key, domain);
    return value ? value : in(stored, key, domain);
  }

  void setValue(const std::string& key, std::int64_t value, const std::string& domain) override {
    calls_.add("setValue " + key + "=" + std::to_string(value));
    pending[domain][key] = static_cast<double>(value);
  }

  void synchronize(const std::string& domain) override {
    calls_.add("synchronize " + domain);
    if (whenSynchronizing) whenSynchronizing();
    for (const auto& [key, value] : pending[domain]) stored[domain][key] = value;
    pending.erase(domain);
  }

  Domains stored;
  Domains pending;
  // Called before anything reaches storage.
  std::function<void()> whenSynchronizing;

 private:
  static std::optional<double> in(const Domains& domains, const std::string& key, const std::string& domain) {
    const auto values = domains.find(domain);
    if (values == domains.end()) return std::nullopt;
    const auto value = values->second.find(key);
    if (value == values->second.end()) return std::nullopt;
    return value->second;
  }

  CallJournal& calls_;
};

}  // namespace norvex

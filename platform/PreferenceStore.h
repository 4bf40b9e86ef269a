// Small numbers that outlive the process, kept by domain (one domain an agent) and key.
//
// Called on one thread at a time: the thread of the run.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace norvex {

class PreferenceStore {
 public:
  virtual ~PreferenceStore() = default;

  // The number under `key`: one that was set in this process, else the stored one. Absent when there is none,
  // when it is no number, and when the store cannot be read.
  virtual std::optional<double> copyValue(const std::string& key, const std::string& domain) = 0;

  // Puts a number under `key`, pending until the domain is synchronised.
  virtual void setValue(const std::string& key, std::int64_t value, const std::string& domain) = 0;

  // Writes the pending numbers of the domain to storage, all or none of them, and keeps whatever else is
  // stored there. Returns when they are safe, also against a loss of power. Never fails towards the caller;
  // where storage refuses, the old content stays whole.
  virtual void synchronize(const std::string& domain) = 0;
};

}  // namespace norvex

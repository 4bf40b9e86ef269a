// Preferences as one small JSON file a domain, such as {"LastVersionRun": 4}, which people can read and edit.
#pragma once

#include <cstdint>
#include <map>
#include <string>

#include "platform/PreferenceStore.h"

namespace norvex {

class JsonPreferenceStore final : public PreferenceStore {
 public:
  // `folder` holds the files, named <domain>.json; it is made (0700) when something is first written. Every
  // byte of a domain that is no letter, digit, "-", "_" or inner "." stands as %XX in the name, so that no
  // domain leads out of the folder.
  explicit JsonPreferenceStore(std::string folder) : folder_(std::move(folder)) {}

  // Reads the file at each call.
  std::optional<double> copyValue(const std::string& key, const std::string& domain) override;

  void setValue(const std::string& key, std::int64_t value, const std::string& domain) override;

  // Writes a new file (0600) beside the old one and puts it in its place; a process that is killed at any
  // moment leaves the one or the other, and its unfinished file is cleared away by the next to write. A file
  // that cannot be read or is no JSON object is kept beside it as <domain>.json.damaged, in place of an older
  // one. Without a pending number nothing is written. When the storage refuses, the numbers stay pending.
  //
  // A file that is a link is written where it leads to: people keep their configuration as links into a
  // folder of their own, and a link that turns into a file would silently leave it. A link that leads nowhere
  // is replaced.
  void synchronize(const std::string& domain) override;

 private:
  using Numbers = std::map<std::string, std::int64_t>;

  std::string pathOf(const std::string& domain) const;

  std::string folder_;
  std::map<std::string, Numbers> pending_;  // by domain
};

}  // namespace norvex

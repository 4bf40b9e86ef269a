// One result or item of the in-memory metadata index: a table of attributes that notes which of them are
// read.
#pragma once

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "tests/support/InMemoryMetadataIndex.h"

namespace norvex {

class InMemoryMetadataResult final : public MetadataResult {
 public:
  using Attributes = std::map<std::string, MetadataValue, std::less<>>;

  // `name` stands for the result in the journal.
  InMemoryMetadataResult(CallJournal& calls, std::shared_ptr<InMemoryMetadataIndex::Liveness> liveness,
                         std::string name, Attributes attributes);
  ~InMemoryMetadataResult() override { --liveness_->now; }
  InMemoryMetadataResult(const InMemoryMetadataResult&) = delete;
  InMemoryMetadataResult& operator=(const InMemoryMetadataResult&) = delete;

  std::optional<MetadataValue> valueForAttribute(std::string_view attribute) const override;

 private:
  CallJournal& calls_;
  std::shared_ptr<InMemoryMetadataIndex::Liveness> liveness_;
  std::string name_;
  Attributes attributes_;
};

}  // namespace norvex

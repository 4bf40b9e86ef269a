// Settings of the backup feature as a plain structure; absent ones cannot be opened.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/BackupSettings.h"
#include "tests/support/CallJournal.h"

namespace norvex {

// What the settings say while they are available.
struct BackupSettingsContent {
  bool automaticBackupsEnabled = false;
  std::vector<std::string> destinations;
  bool systemFilesSkipped = false;
  std::optional<std::vector<std::string>> includedVolumes;
};

class InMemoryBackupSettings final : public BackupSettings {
 public:
  explicit InMemoryBackupSettings(CallJournal& calls) : calls_(calls) {}

  std::unique_ptr<BackupSettingsHandle> open() override {
    calls_.add("openBackupSettings");
    if (!content) return nullptr;
    ++openHandles;
    return std::make_unique<Handle>(*this);
  }

  // Absent: the settings are not available.
  std::optional<BackupSettingsContent> content;
  int openHandles = 0;

 private:
  class Handle final : public BackupSettingsHandle {
   public:
    explicit Handle(InMemoryBackupSettings& owner) : owner_(owner), content_(*owner.content) {}
    ~Handle() override {
      owner_.calls_.add("closeBackupSettings");
      --owner_.openHandles;
    }
    bool automaticBackupsEnabled() const override { return content_.automaticBackupsEnabled; }
    std::vector<std::string> destinations() const override { return content_.destinations; }
    bool systemFilesSkipped() const override { return content_.systemFilesSkipped; }
    std::optional<std::vector<std::string>> includedVolumes() const override {
      owner_.calls_.add("includedVolumes");
      return content_.includedVolumes;
    }

   private:
    InMemoryBackupSettings& owner_;
    BackupSettingsContent content_;
  };

  CallJournal& calls_;
};

}  // namespace norvex

// The three roles that a report needs, in memory, installed for the life of the object. No other role is
// there: a call to one ends the test program.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "platform/Platform.h"

namespace norvex {

class ReportWorld : private DiagnosticLog, private Installation, private ByteCountFormatter {
 public:
  struct Message {
    std::string domain;
    int level;
    std::vector<std::pair<std::string, std::string>> pairs;
  };
  struct {
    std::vector<Message> messages;
  } diagnosticLog;
  struct {
    bool isInternal = false;
  } installation;
  struct {
    std::vector<std::string> all() const { return lines; }
    std::vector<std::string> lines;
  } calls;

 private:
  void logWithKeys(std::string_view domain, int level, std::span<const DiagnosticPair> pairs) override {
    calls.lines.push_back("logWithKeys " + std::string(domain));
    Message message{std::string(domain), level, {}};
    for (const DiagnosticPair& pair : pairs) message.pairs.emplace_back(pair.key, pair.value);
    diagnosticLog.messages.push_back(std::move(message));
  }
  bool isInternalInstall() override {
    calls.lines.push_back("isInternalInstall");
    return installation.isInternal;
  }
  std::string string(std::uint64_t bytes) const override { return std::to_string(bytes) + " bytes"; }

  // Room for a role in which none was ever made.
  template <typename Role>
  static Role& absent() {
    alignas(Role) static std::byte room[sizeof(Role)];
    return reinterpret_cast<Role&>(room);
  }

  Platform roles_{.activityScheduler = absent<ActivityScheduler>(),
                  .backupSettings = absent<BackupSettings>(),
                  .byteCountFormatter = *this,
                  .clock = absent<Clock>(),
                  .diagnosticLog = *this,
                  .directoryEnumeration = absent<DirectoryEnumeration>(),
                  .directoryListing = absent<DirectoryListing>(),
                  .eventLoops = absent<EventLoops>(),
                  .fileExistence = absent<FileExistence>(),
                  .installation = *this,
                  .jobRegistry = absent<JobRegistry>(),
                  .mediaMetadataReader = absent<MediaMetadataReader>(),
                  .memoryPressureSource = absent<MemoryPressureSource>(),
                  .metadataIndex = absent<MetadataIndex>(),
                  .preferenceStore = absent<PreferenceStore>(),
                  .processControl = absent<ProcessControl>(),
                  .processMemoryInfo = absent<ProcessMemoryInfo>(),
                  .resourceValues = absent<ResourceValues>(),
                  .systemControl = absent<SystemControl>(),
                  .systemLog = absent<SystemLog>(),
                  .userFolders = absent<UserFolders>(),
                  .volumeCatalog = absent<VolumeCatalog>()};
  ScopedPlatform installed_{roles_};
};

}  // namespace norvex

// What a folder means for the items in it and for its own attributes: applications, receipts, mail, caches.
//
// Used by the crawler, on any thread. Pure: the crawler looks, these say what it has seen. Paths are
// absolute, without a slash at their end.
#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace norvex {

// --- applications

// Whether a folder of this name is an application: everything in it is counted as one. Any case of letters.
bool isApplicationBundleName(std::string_view name);

// The Flatpak installations of the system and of the user with this data folder.
std::vector<std::string> flatpakInstallations(std::string_view dataHome);

// Whether the folder is an application's deployment, `<installation>/app/<id>`; what lies in it is not, and
// neither are runtimes. It has a receipt, and everything in it is counted as an application.
bool isFlatpakDeployment(std::string_view folderPath, std::span<const std::string> installations);

// --- receipts

// Where a package of any kind, by its name or by its mark, keeps the receipt of the application store.
inline constexpr std::string_view kReceiptPathInPackage = "Contents/_DovecartReceipt/receipt";

// Whether a regular file of this name, a direct child of this folder, is an installed snap: those have
// receipts too.
bool isInstalledSnap(std::string_view folderPath, std::string_view name);

// --- mail

// Tells from the names of a folder's subfolders whether it is a Maildir.
class MaildirSigns {
 public:
  // To be called for each folder that is a direct child.
  void seeFolder(std::string_view name);
  bool isMaildir() const { return seen_ == kAll; }

 private:
  static constexpr unsigned kAll = 7;
  unsigned seen_ = 0;
};

// Whether this subfolder of a Maildir is one that holds messages, as its direct children.
bool isMaildirMessageFolder(std::string_view name);

// --- exclusion from backups

// The name of the file that marks a folder as a cache, and how much of it has to be read.
inline constexpr std::string_view kCacheTagName = "CACHEDIR.TAG";
inline constexpr std::size_t kCacheTagSignatureSize = 43;

// What was found at kCacheTagName, links not followed.
struct CacheTag {
  bool isRegularFile = false;
  bool isInVolumeRoot = false;  // a whole volume is never a cache
  std::string_view firstBytes;  // at least kCacheTagSignatureSize, where the file has as many
};
bool isValidCacheTag(const CacheTag& tag);

// The attribute by which a folder refuses to be kept in backups, and whether a value of it does so. On
// anything but a folder it has no meaning.
inline constexpr const char* kRobotsBackupAttribute = "user.xdg.robots.backup";
bool refusesBackup(std::string_view robotsBackupValue);

}  // namespace norvex

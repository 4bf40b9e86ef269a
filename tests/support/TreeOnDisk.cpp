#include "tests/support/TreeOnDisk.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <system_error>

namespace norvex::ondisk {
namespace {

// Every failure is one of preparing a test.
int checked(int result, const std::string& what) {
  if (result < 0) throw std::system_error(errno, std::generic_category(), what);
  return result;
}

class OpenFile {
 public:
  explicit OpenFile(int number) : number_(number) {}
  ~OpenFile() { ::close(number_); }
  OpenFile(const OpenFile&) = delete;
  OpenFile& operator=(const OpenFile&) = delete;
  int number() const { return number_; }

 private:
  const int number_;
};

int openFolder(int parent, const char* name) {
  return checked(::openat(parent, name, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC), name);
}

void make(int root, int parent, const std::vector<Item>& items);

void finish(int descriptor, const Item& item) {
  if (!item.attributeName.empty()) {
    checked(::fsetxattr(descriptor, item.attributeName.c_str(), item.attributeValue.data(),
                        item.attributeValue.size(), 0),
            item.attributeName);
  }
  if (item.mode) checked(::fchmod(descriptor, *item.mode), item.name);
}

void make(int root, int parent, const Item& item) {
  const char* name = item.name.c_str();
  switch (item.kind) {
    case Item::Kind::file: {
      const OpenFile made(
          checked(::openat(parent, name, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0644), name));
      checked(::ftruncate(made.number(), static_cast<off_t>(item.size)), name);
      return finish(made.number(), item);
    }
    case Item::Kind::folder: {
      checked(::mkdirat(parent, name, 0755), name);
      const OpenFile made(openFolder(parent, name));
      make(root, made.number(), item.children);
      return finish(made.number(), item);
    }
    case Item::Kind::link:
      checked(::symlinkat(item.target.c_str(), parent, name), name);
      return;
    case Item::Kind::hardLink:
      checked(::linkat(root, item.target.c_str(), parent, name, 0), name);
      return;
    case Item::Kind::fifo:
      checked(::mkfifoat(parent, name, 0644), name);
      return;
  }
}

void make(int root, int parent, const std::vector<Item>& items) {
  for (const Item& item : items) make(root, parent, item);
}

std::filesystem::path temporaryFolder(Medium medium) {
  constexpr const char* kInMemory = "/dev/shm";
  const bool inMemory = medium == Medium::memory && ::access(kInMemory, W_OK | X_OK) == 0;
  return inMemory ? std::filesystem::path(kInMemory) : std::filesystem::temp_directory_path();
}

std::vector<std::string> namesIn(int folder) {
  std::vector<std::string> names;
  DIR* entries = ::fdopendir(checked(::dup(folder), "dup"));
  ::rewinddir(entries);
  while (const dirent* entry = ::readdir(entries)) {
    const std::string name = entry->d_name;
    if (name != "." && name != "..") names.push_back(name);
  }
  ::closedir(entries);
  return names;
}

bool isFolder(int parent, const std::string& name) {
  struct stat attributes;
  checked(::fstatat(parent, name.c_str(), &attributes, AT_SYMLINK_NOFOLLOW), name);
  return S_ISDIR(attributes.st_mode);
}

// Empties a tree of any depth with two descriptors: a folder's folders are moved up into `top` until only
// empty ones are left.
void empty(int top) {
  std::size_t moved = 0;
  for (std::vector<std::string> names = namesIn(top); !names.empty(); names = namesIn(top)) {
    for (const std::string& name : names) {
      if (!isFolder(top, name)) {
        checked(::unlinkat(top, name.c_str(), 0), name);
        continue;
      }
      checked(::fchmodat(top, name.c_str(), 0700, 0), name);
      const OpenFile folder(openFolder(top, name.c_str()));
      for (const std::string& child : namesIn(folder.number())) {
        if (!isFolder(folder.number(), child)) {
          checked(::unlinkat(folder.number(), child.c_str(), 0), child);
          continue;
        }
        std::string free;
        do free = ".moved-" + std::to_string(moved++);
        while (::faccessat(top, free.c_str(), F_OK, AT_SYMLINK_NOFOLLOW) == 0);
        checked(::renameat(folder.number(), child.c_str(), top, free.c_str()), child);
      }
      checked(::unlinkat(top, name.c_str(), AT_REMOVEDIR), name);
    }
  }
}

}  // namespace

Item Item::withMode(mode_t permissions) const {
  Item item = *this;
  item.mode = permissions;
  return item;
}

Item Item::withAttribute(std::string itsName, std::string itsValue) const {
  Item item = *this;
  item.attributeName = std::move(itsName);
  item.attributeValue = std::move(itsValue);
  return item;
}

Item file(std::string name, std::uint64_t size) {
  Item item;
  item.name = std::move(name);
  item.size = size;
  return item;
}

Item folder(std::string name, std::vector<Item> children) {
  Item item;
  item.name = std::move(name);
  item.kind = Item::Kind::folder;
  item.children = std::move(children);
  return item;
}

Item link(std::string name, std::string target) {
  Item item = file(std::move(name));
  item.kind = Item::Kind::link;
  item.target = std::move(target);
  return item;
}

Item hardLink(std::string name, std::string pathBelowRoot) {
  Item item = link(std::move(name), std::move(pathBelowRoot));
  item.kind = Item::Kind::hardLink;
  return item;
}

Item fifo(std::string name) {
  Item item = file(std::move(name));
  item.kind = Item::Kind::fifo;
  return item;
}

TreeOnDisk::TreeOnDisk(const std::vector<Item>& items, Medium medium) {
  path_ = (temporaryFolder(medium) / "norvex-tree-XXXXXX").string();
  if (::mkdtemp(path_.data()) == nullptr) checked(-1, path_);
  // Tests look at it as another user, too.
  checked(::chmod(path_.c_str(), 0755), path_);
  add(".", items);
}

TreeOnDisk::~TreeOnDisk() {
  try {
    clear();
  } catch (const std::system_error&) {
    return;  // the system's temporary folder is cleared from time to time
  }
  ::rmdir(path_.c_str());
}

void TreeOnDisk::add(std::string_view below, const std::vector<Item>& items) const {
  const OpenFile root(openFolder(AT_FDCWD, path_.c_str()));
  const OpenFile parent(openFolder(root.number(), std::string(below).c_str()));
  make(root.number(), parent.number(), items);
}

std::string TreeOnDisk::addChain(std::size_t depth, const std::string& name,
                                 const std::vector<Item>& items) const {
  const OpenFile root(openFolder(AT_FDCWD, path_.c_str()));
  make(root.number(), root.number(), items);
  std::string deepest = path_;
  int parent = checked(::dup(root.number()), path_);
  for (std::size_t level = 0; level < depth; ++level) {
    const OpenFile above(parent);
    checked(::mkdirat(parent, name.c_str(), 0755), name);
    parent = openFolder(parent, name.c_str());
    make(root.number(), parent, items);
    deepest += '/' + name;
  }
  ::close(parent);
  return deepest;
}

void TreeOnDisk::remove(std::string_view below) const {
  const std::string item = path(below);
  if (!isFolder(AT_FDCWD, item)) {
    checked(::unlink(item.c_str()), item);
    return;
  }
  const OpenFile folder(openFolder(AT_FDCWD, item.c_str()));
  empty(folder.number());
  checked(::rmdir(item.c_str()), item);
}

void TreeOnDisk::clear() const {
  const OpenFile root(openFolder(AT_FDCWD, path_.c_str()));
  empty(root.number());
}

}  // namespace norvex::ondisk

#include "platform/linux/ReadAhead.h"

#include <cerrno>
#include <system_error>

namespace norvex {
namespace {

// A walk over fewer items is over before a second thread pays.
constexpr std::size_t kItemsBeforeHelp = 1000;

std::size_t memoryOf(const WalkedFolder& folder, const ReadFolder& result) {
  return folder.items.capacity() * sizeof(WalkedItem) + folder.names.capacity() +
         (1 + result.subfolders.size()) * sizeof(WalkedFolder);
}

}  // namespace

ReadAhead::ReadAhead(const std::string& root, bool marksWanted)
    : rootPath_(root), reader_(marksWanted), helperReader_(marksWanted), root_(pending_.emplace_back()) {
  root_.place = pending_.begin();
}

ReadAhead::~ReadAhead() {
  if (!helper_.joinable()) return;
  {
    const Lock lock(mutex_);
    stopping_ = true;
  }
  workIsThere_.notify_one();
  helper_.join();
}

void ReadAhead::await(WalkedFolder& folder) {
  Lock lock(mutex_);
  while (folder.state != WalkedFolder::State::read) {
    // The earliest unread folder is the awaited one, unless the helper is reading that: then it is one after
    // it.
    if (folder.state == WalkedFolder::State::unread || mayReadOn()) {
      read(claim(), reader_, lock);
    } else {
      walkWaits_ = true;
      folderIsRead_.wait(lock);
      walkWaits_ = false;
    }
  }
  bytesAhead_ -= folder.memory;
  if (bytesAhead_ < kMostBytesAhead / 2) wakeHelper();
  lock.unlock();
  if (itemsWalked_ < kItemsBeforeHelp) {
    itemsWalked_ += folder.items.size();
    if (itemsWalked_ >= kItemsBeforeHelp) startHelper();
  }
}

void ReadAhead::discard(WalkedFolder& folder) {
  std::list<WalkedFolder> last;
  const Lock lock(mutex_);
  last.splice(last.begin(), read_, folder.place);
}

void ReadAhead::startHelper() {
  try {
    helper_ = std::thread(&ReadAhead::help, this);
  } catch (const std::system_error&) {
    // No thread to be had: the walking thread reads all by itself.
  }
}

void ReadAhead::help() {
  Lock lock(mutex_);
  while (!stopping_) {
    if (mayReadOn()) {
      read(claim(), helperReader_, lock);
    } else {
      helperWaits_ = true;
      workIsThere_.wait(lock);
      helperWaits_ = false;
    }
  }
}

// Only when a folder is unread.
WalkedFolder& ReadAhead::claim() {
  auto place = pending_.begin();
  while (place->state != WalkedFolder::State::unread) ++place;
  place->state = WalkedFolder::State::beingRead;
  --unread_;
  return *place;
}

void ReadAhead::read(WalkedFolder& folder, WalkedFolderReader& reader, Lock& lock) {
  FolderDescriptors::Descriptor parent;
  if (folder.parent != nullptr) parent = descriptors_.parentOf(folder, folder.error);
  lock.unlock();
  ReadFolder result;
  if (folder.parent == nullptr) {
    result = reader.readRoot(folder, rootPath_);
  } else if (parent) {
    result = readBelow(*parent, folder, reader);
  }
  parent = nullptr;
  if (result.subfolders.empty()) result.descriptor = FileDescriptor();
  folder.memory = memoryOf(folder, result);
  lock.lock();
  publish(folder, std::move(result));
}

ReadFolder ReadAhead::readBelow(const FileDescriptor& parent, WalkedFolder& folder,
                                WalkedFolderReader& reader) {
  ReadFolder result = reader.read(folder, parent);
  if (folder.error != EMFILE && folder.error != ENFILE) return result;
  {
    const Lock lock(mutex_);
    descriptors_.makeRoom();
  }
  return reader.read(folder, parent);
}

void ReadAhead::publish(WalkedFolder& folder, ReadFolder result) {
  folder.state = WalkedFolder::State::read;
  folder.unopenedSubfolders = result.subfolders.size();
  unread_ += folder.unopenedSubfolders;
  bytesAhead_ += folder.memory;
  if (result.descriptor) descriptors_.keep(folder, std::move(result.descriptor));
  pending_.splice(folder.place, result.subfolders);
  read_.splice(read_.end(), pending_, folder.place);
  wakeHelper();
  if (walkWaits_) folderIsRead_.notify_one();
}

void ReadAhead::wakeHelper() {
  if (helperWaits_ && mayReadOn()) workIsThere_.notify_one();
}

}  // namespace norvex

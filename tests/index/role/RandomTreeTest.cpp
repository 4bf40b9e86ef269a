// What the scan's predicates find in a random tree, against what find finds there.
#include <gmock/gmock.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <memory>
#include <random>

#include "QueriedVolume.h"

namespace norvex {
namespace {

constexpr std::string_view kTag = "Signature: 8a477f597d28d172789f06886806bc55";

// Names of everything that a predicate looks for, and of what only looks like it.
constexpr std::array<const char*, 26> kFileNames{
    "a.jpg", "b.JPEG", "c.png",     "d.gif",  "e.mp3",   "f.m4a",     "g.flac",     "h.wav",       "i.mp4",
    "j.MKV", "k.avi",  "l.mov",     "m.ipa",  "n.qcow2", "o.vmdk",    "p.VDI",      "q.txt",       "r",
    "jpg",   ".mp3",   "s.ipa.bak", "t.jpg~", "u v.png", "w\xff.jpg", "x.vmwarevm", "CACHEDIR.TAG"};
constexpr std::array<const char*, 10> kFolderNames{"folder",           "A.app", "b.APP",   "vm.vmwarevm",
                                                   "vm.pvm",           "x.jpg", "y.qcow2", "Contents",
                                                   "_DovecartReceipt", "z"};

class RandomTree {
 public:
  RandomTree(const TestVolume& volume, unsigned seed) : volume_(volume), random_(seed) {
    fill("", 0);
    // Where chance alone seldom puts one.
    for (const char* bundle : {"Bought.app", "z/Bought too.APP", "z/no bundle"}) {
      volume_.file(std::string(bundle) + "/Contents/_DovecartReceipt/receipt", "1");
    }
  }

 private:
  std::size_t below(std::size_t limit) { return random_() % limit; }

  void fill(const std::string& folder, int depth) {
    for (const char* name : kFileNames) {
      if (below(2) == 0) continue;
      const bool isTag = name == std::string_view("CACHEDIR.TAG") && below(2) == 0;
      volume_.file(folder + name, isTag ? std::string(kTag) : std::string(below(40), 'x'));
    }
    if (below(3) == 0) volume_.link(folder + "link.jpg", "a.jpg");
    for (const char* name : kFolderNames) {
      if (depth == 3 || below(3) != 0) continue;
      volume_.folder(folder + name);
      fill(folder + name + "/", depth + 1);
    }
  }

  const TestVolume& volume_;
  std::mt19937 random_;
};

// The paths below the volume that a find expression prints, sorted.
std::vector<std::string> found(const TestVolume& volume, const std::string& expression) {
  // In the C locale, where any byte is a character.
  const std::string command = "LC_ALL=C find '" + volume.root() + "' -mindepth 1 " + expression;
  const std::unique_ptr<std::FILE, int (*)(std::FILE*)> pipe(::popen(command.c_str(), "r"), ::pclose);
  std::vector<std::string> paths;
  std::string path;
  for (int byte = 0; pipe != nullptr && (byte = std::fgetc(pipe.get())) != EOF;) {
    if (byte != '\0') {
      path += static_cast<char>(byte);
      continue;
    }
    paths.push_back(path.substr(volume.root().size()));
    path.clear();
  }
  std::ranges::sort(paths);
  return paths;
}

// A find expression of the files with one of these endings.
std::string filesEndingIn(const std::string& endings) {
  return "-type f -regextype posix-extended -iregex '.*/[^/]*\\.(" + endings + ")' -print0";
}

TEST(RandomTree, EachOfTheScansPredicatesFindsWhatFindFinds) {
  const std::vector<std::pair<const char*, std::string>> rows = {
      {"com_brixo_backup_excludeItem == 'com.brixo.backupd'",
       "-type f -name CACHEDIR.TAG -size 43c -exec grep -qx '" + std::string(kTag) +
           "' {} \\; -printf '%h\\0'"},
      {"kMDItemDovecartHasReceipt=1",
       "-type d \\( -iname '*.app' -o -iname '*.vmwarevm' -o -iname '*.pvm' \\) "
       "-exec test -f {}/Contents/_DovecartReceipt/receipt \\; -print0"},
      {"kMDItemContentTypeTree == 'public.image'", filesEndingIn("jpg|jpeg|png|gif")},
      {"kMDItemContentTypeTree == 'public.audio'", filesEndingIn("mp3|m4a|flac|wav")},
      {"kMDItemContentTypeTree == 'public.movie' || kMDItemContentTypeTree == 'public.video'",
       filesEndingIn("mp4|mkv|avi|mov")},
      {"kMDItemContentType == 'com.brixo.sonpix.ipa'", filesEndingIn("ipa")},
      {"kMDItemContentType == 'com.vmware.vm-package' || kMDItemContentType == "
       "'com.parallels.vm.vmpackage' || kMDItemKind == 'Virtual Disk Image'",
       "\\( -type f \\( -name '*.qcow2' -o -name '*.vmdk' -o -iname '*.vdi' \\) -o -type d \\( -iname "
       "'*.vmwarevm' -o -iname '*.pvm' \\) \\) -print0"},
  };
  for (const unsigned seed : {1U, 2U}) {
    QueriedVolume queried;
    const RandomTree tree(queried.volume, seed);
    ASSERT_TRUE(queried.volume.update().ok());
    for (const auto& [predicate, expression] : rows) {
      auto matches = queried.search(predicate);
      std::ranges::sort(matches);
      const auto expected = found(queried.volume, expression);
      EXPECT_FALSE(expected.empty()) << predicate << " with seed " << seed;
      EXPECT_EQ(matches, expected) << predicate << " with seed " << seed;
    }
  }
}

}  // namespace
}  // namespace norvex

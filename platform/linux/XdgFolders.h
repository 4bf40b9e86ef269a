// Where the user's home and the four base folders of his programs are.
//
// Made once from the environment when the process starts; a plain value from then on.
#pragma once

#include <functional>
#include <optional>
#include <string>

#include "platform/linux/Environment.h"

namespace norvex {

// All are absolute and without a trailing separator (the root alone is "/"); none need exist.
struct XdgFolders {
  std::string home;    // $HOME, else the password database, else a folder that does not exist
  std::string config;  // $XDG_CONFIG_HOME, else .config of the home folder
  std::string state;   // $XDG_STATE_HOME, else .local/state
  std::string cache;   // $XDG_CACHE_HOME, else .cache
  std::string data;    // $XDG_DATA_HOME, else .local/share

  // The home folder of the process's user according to the password database, absent when it has none.
  using HomeLookup = std::function<std::optional<std::string>()>;
  static std::optional<std::string> homeInPasswordDatabase();

  // A variable that is not an absolute path counts as not set: it would name a different folder in every
  // working folder.
  static XdgFolders fromEnvironment(const Environment& environment,
                                    const HomeLookup& homeLookup = homeInPasswordDatabase);
};

}  // namespace norvex

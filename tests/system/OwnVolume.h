// A volume of a test's own, and the companion command over it. To be used in a process that a test has forked
// (AgentWorld::beforeExec): the mounts are that process's alone and go with it.
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "AgentWorld.h"

namespace norvex {

// The exit status of a process that may not mount anything.
inline constexpr int kNotAllowed = 77;

// Makes the folder and mounts an empty file system there; ends the process with kNotAllowed where that is not
// allowed.
void mountVolume(const std::filesystem::path& folder);

// A file of this size, which takes no room.
void makeFile(const std::filesystem::path& file, std::uintmax_t size);

// Runs the companion command and returns its exit status. Its standard output goes to the file, if one is
// named.
int runTool(const AgentWorld& world, const std::vector<std::string>& arguments,
            const std::optional<std::filesystem::path>& output = std::nullopt);

}  // namespace norvex

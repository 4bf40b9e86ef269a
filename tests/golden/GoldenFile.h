// Expected outputs that stand whole in files, in the folder "golden" of the tests that include it.
//
// Compiled into each such test program (norvex_golden_files), which knows its own folder.
#pragma once

#include <string>

namespace norvex {

// The whole file; throws when it cannot be read.
std::string readGolden(const std::string& name);

// Expects `text` to be the whole file; a difference is shown line by line.
//
// With NORVEX_REWRITE_GOLDEN=1 in the environment the file is rewritten instead, and the test fails all the
// same, so that nobody takes that run for a passed one. The files were worked out by another program: look at
// every changed line, each is a change of what readers of the reports get.
void expectGolden(const std::string& name, const std::string& text);

}  // namespace norvex

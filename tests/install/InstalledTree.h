// InstalledTree: what the install suite shares: the scratch installation that its ctest fixture makes
// (DESTDIR=VELMAR_INSTALL_ROOT, prefix VELMAR_INSTALL_PREFIX), the build tree's programs, and the options
// that a program's --help names.
#pragma once

#include <set>
#include <string>
#include <vector>

#include "tests/support/Process.h"

namespace velmar::testing {

// A path below the installed prefix, e.g. installedPath("bin/kxserverd").
std::string installedPath(const std::string& relative);

// The build tree's program of that name: velmar, kxserverd or velmar-decode.
std::string builtProgram(const std::string& name);

// The three programs, by name.
const std::vector<std::string>& programNames();

// Runs a program as an installed program runs: with VELMAR_RESOURCE_DIR unset, so that it finds its templates
// on its own.
ProcessResult runWithoutResourceDirectory(const std::vector<std::string>& arguments);

// Every "--name" that a --help text mentions.
std::set<std::string> optionsNamedIn(const std::string& helpText);

}  // namespace velmar::testing

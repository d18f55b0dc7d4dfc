// ChangingValues: for the end-to-end tests, which pane of a live monitor shows values that keep changing.
// Snapshots map each leaf's path to its value; the busiest pane is the inner node whose leaves changed in the
// most pairs of consecutive snapshots; on a tie, one whose path has no list index in it.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "core/VelmarModelNode.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::testing {

using LeafValues = std::map<std::string, std::string>;

LeafValues leavesOf(const VelmarModelNodeRef& root);
// The same from the headless front end's JSON form of a tree ({"name", "children"} / {"name", "value"}).
LeafValues leavesOfJson(const PlistValue& root);
// The pane's path, or empty when no value changed.
std::string busiestPane(const std::vector<LeafValues>& snapshots);
// A pane of the simulated baseband of technology (gsm, lte, utran, cdma, ifx) whose values change at almost
// every display tick at any seed (its levels fade as the device moves), for tests that watch one pane.
std::string livelyPaneOf(const std::string& technology);
// "/A/B" → {"A", "B"}.
std::vector<std::string> pathComponents(const std::string& path);

}  // namespace velmar::testing

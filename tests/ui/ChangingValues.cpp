#include "tests/ui/ChangingValues.h"

#include <algorithm>
#include <cctype>

namespace velmar::testing {

namespace {

void collect(const VelmarModelNode& node, const std::string& path, LeafValues& out) {
    if (const NodeList* children = node.childNodes()) {
        for (const auto& child : *children) {
            collect(*child, joinDisplayPath(path, child->displayName()), out);
        }
    } else if (const std::string* value = node.value()) {
        out[path] = *value;
    }
}

void collectJson(const PlistValue& node, const std::string& path, LeafValues& out) {
    const PlistDictionaryRef& fields = node.dictionary();
    if (!fields) {
        return;
    }
    if (const PlistArrayRef& children = fields->get("children").array()) {
        for (const PlistValue& child : *children) {
            const PlistDictionaryRef& childFields = child.dictionary();
            const std::string* name = childFields ? childFields->get("name").string() : nullptr;
            if (name != nullptr) {
                collectJson(child, joinDisplayPath(path, *name), out);
            }
        }
    } else if (const std::string* value = fields->get("value").string()) {
        out[path] = *value;
    }
}

std::string parentOf(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    return slash == 0 || slash == std::string::npos ? "/" : path.substr(0, slash);
}

bool hasIndexComponent(const std::string& path) {
    for (const std::string& component : pathComponents(path)) {
        if (!component.empty() && std::all_of(component.begin(), component.end(),
                                              [](unsigned char c) { return std::isdigit(c) != 0; })) {
            return true;
        }
    }
    return false;
}

}  // namespace

LeafValues leavesOf(const VelmarModelNodeRef& root) {
    LeafValues out;
    if (root) {
        collect(*root, "/", out);
    }
    return out;
}

LeafValues leavesOfJson(const PlistValue& root) {
    LeafValues out;
    collectJson(root, "/", out);
    return out;
}

std::vector<std::string> pathComponents(const std::string& path) {
    std::vector<std::string> components;
    std::size_t start = 0;
    while (start < path.size()) {
        const std::size_t end = path.find('/', start);
        const std::string component =
            path.substr(start, end == std::string::npos ? std::string::npos : end - start);
        if (!component.empty()) {
            components.push_back(component);
        }
        if (end == std::string::npos) {
            break;
        }
        start = end + 1;
    }
    return components;
}

std::string busiestPane(const std::vector<LeafValues>& snapshots) {
    std::map<std::string, int> changes;
    for (std::size_t i = 1; i < snapshots.size(); ++i) {
        std::map<std::string, bool> changedHere;
        for (const auto& [path, value] : snapshots[i]) {
            const auto before = snapshots[i - 1].find(path);
            if (before != snapshots[i - 1].end() && before->second != value && parentOf(path) != "/") {
                changedHere[parentOf(path)] = true;
            }
        }
        for (const auto& [pane, changed] : changedHere) {
            changes[pane] += changed ? 1 : 0;
        }
    }
    std::string best;
    int bestCount = 0;
    bool bestIndexed = true;
    for (const auto& [pane, count] : changes) {
        const bool indexed = hasIndexComponent(pane);
        if (count > bestCount || (count == bestCount && bestIndexed && !indexed)) {
            best = pane;
            bestCount = count;
            bestIndexed = indexed;
        }
    }
    return best;
}

std::string livelyPaneOf(const std::string& technology) {
    if (technology == "gsm") {
        return "/UMTS/UMTS RR Info";
    }
    if (technology == "utran") {
        return "/Serving Cell Info";
    }
    if (technology == "cdma") {
        return "/1x/Radio";
    }
    if (technology == "ifx") {
        return "/Serving Cell";
    }
    return "/Serving Cell/Connected mode LTE Intra-frequency Measurement";
}

}  // namespace velmar::testing

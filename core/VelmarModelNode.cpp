#include "core/VelmarModelNode.h"

#include <algorithm>

#include "core/ArrayLock.h"

namespace velmar {

namespace {

constexpr std::string_view kSortKey = "_sorted";
constexpr std::string_view kRootName = "Velmar";
constexpr std::string_view kUnknownValue = "(unknown)";

// For a sorted dictionary: the part after the ";" when the key splits into exactly two parts.
std::string_view sortedDisplayName(std::string_view key) {
    const std::size_t first = key.find(';');
    if (first == std::string_view::npos || key.find(';', first + 1) != std::string_view::npos) {
        return key;
    }
    return key.substr(first + 1);
}

VelmarModelNodeRef buildNode(std::string_view name, const PlistValue& object, NodePathDictionary& paths,
                             const std::string& path);

VelmarModelNodeRef buildDictionaryNode(std::string_view name, const PlistDictionary& dictionary,
                                       NodePathDictionary& paths, const std::string& path) {
    const bool sorted = dictionary.contains(kSortKey);
    std::vector<const PlistDictionary::Entry*> order;
    order.reserve(dictionary.size());
    for (const auto& entry : dictionary) {
        order.push_back(&entry);
    }
    if (sorted) {
        std::stable_sort(order.begin(), order.end(),
                         [](const auto* a, const auto* b) { return a->first < b->first; });
    }
    NodeList children;
    children.reserve(order.size());
    for (const auto* entry : order) {
        if (entry->first == kSortKey || entry->second.isNone()) {
            continue;
        }
        const std::string_view displayName = sorted ? sortedDisplayName(entry->first) : entry->first;
        if (auto child = buildNode(displayName, entry->second, paths, joinDisplayPath(path, displayName))) {
            children.push_back(std::move(child));
        }
    }
    return std::make_shared<VelmarModelTreeNode>(std::string(name), std::move(children));
}

VelmarModelNodeRef buildArrayNode(std::string_view name, const PlistArray& array, NodePathDictionary& paths,
                                  const std::string& path) {
    ArrayLock::lockArray();
    NodeList children;
    children.reserve(array.size());
    for (const auto& element : array) {
        const std::string indexName = std::to_string(children.size());
        if (auto child = buildNode(indexName, element, paths, joinDisplayPath(path, indexName))) {
            children.push_back(std::move(child));
        }
    }
    ArrayLock::unlockArray();
    return std::make_shared<VelmarModelTreeNode>(std::string(name), std::move(children));
}

VelmarModelNodeRef buildNode(std::string_view name, const PlistValue& object, NodePathDictionary& paths,
                             const std::string& path) {
    VelmarModelNodeRef node;
    if (const std::string* text = object.string()) {
        node = std::make_shared<VelmarModelLeafNode>(std::string(name), *text);
    } else if (const auto& dictionary = object.dictionary()) {
        node = buildDictionaryNode(name, *dictionary, paths, path);
    } else if (const auto& array = object.array()) {
        node = buildArrayNode(name, *array, paths, path);
    } else {
        node = std::make_shared<VelmarModelLeafNode>(std::string(name), std::string(kUnknownValue));
    }
    paths.set(path, node);
    return node;
}

}  // namespace

VelmarModelNodeRef VelmarModelNode::makeTreeFromObject(const PlistValue& object, NodePathDictionary& paths) {
    return buildNode(kRootName, object, paths, "/");
}

std::string joinDisplayPath(std::string_view path, std::string_view name) {
    std::string joined;
    joined.reserve(path.size() + name.size() + 1);
    auto appendComponentText = [&joined](std::string_view text) {
        for (const char c : text) {
            if (c == '/' && !joined.empty() && joined.back() == '/') {
                continue;
            }
            joined.push_back(c);
        }
    };
    appendComponentText(path);
    if (joined.empty() || joined.back() != '/') {
        joined.push_back('/');
    }
    appendComponentText(name);
    while (joined.size() > 1 && joined.back() == '/') {
        joined.pop_back();
    }
    return joined;
}

}  // namespace velmar

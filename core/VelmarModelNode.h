// VelmarModelNode: the display tree that the panes browse, built from a generator's display output.
//
// Contract: a node has a display name and either a value (VelmarModelLeafNode) or child nodes
// (VelmarModelTreeNode). A node is an inner node exactly when childNodes() is non-null, even with no
// children. makeTreeFromObject builds the tree from a property-list value (strings become leaves,
// dictionaries and arrays inner nodes, anything else a leaf showing "(unknown)") and records every node
// in the path dictionary under its path, the root "Velmar" under "/". A dictionary holding the key "_sorted"
// has its keys ordered as plain strings and shows, for keys of the form "prefix;name", only "name"; the
// key "_sorted" itself is never shown. Arrays are walked under ArrayLock.
#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "core/platform/InsertionOrderedMap.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

class VelmarModelNode;
using VelmarModelNodeRef = std::shared_ptr<VelmarModelNode>;
using NodeList = std::vector<VelmarModelNodeRef>;
// Path → node, for every node of one tree.
using NodePathDictionary = InsertionOrderedMap<VelmarModelNodeRef>;

class VelmarModelNode {
  public:
    explicit VelmarModelNode(std::string name) : _name(std::move(name)) {}
    virtual ~VelmarModelNode() = default;

    const std::string& displayName() const { return _name; }
    // Null in the base and for leaves.
    virtual const NodeList* childNodes() const { return nullptr; }
    // Null in the base and for inner nodes.
    virtual const std::string* value() const { return nullptr; }

    static VelmarModelNodeRef makeTreeFromObject(const PlistValue& object, NodePathDictionary& paths);

  private:
    std::string _name;
};

class VelmarModelLeafNode : public VelmarModelNode {
  public:
    VelmarModelLeafNode(std::string name, std::string value)
        : VelmarModelNode(std::move(name)), _string(std::move(value)) {}
    const std::string* value() const override { return &_string; }

  private:
    std::string _string;
};

class VelmarModelTreeNode : public VelmarModelNode {
  public:
    VelmarModelTreeNode(std::string name, NodeList children)
        : VelmarModelNode(std::move(name)), _childNodes(std::move(children)) {}
    const NodeList* childNodes() const override { return &_childNodes; }

  private:
    NodeList _childNodes;
};

// Joins a path and a display name with exactly one "/" between them, no doubled and no trailing "/".
std::string joinDisplayPath(std::string_view path, std::string_view name);

}  // namespace velmar

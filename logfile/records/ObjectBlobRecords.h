// ObjectBlobRecords: builders of the blobs of the object-based (IFX) baseband, for the tests and the
// simulated baseband. Such a blob is one serialised property list holding the whole picture: nested groups of
// string values (dictionaries), lists (arrays) and texts.
//
// Contract: ObjectEntry describes one named entry: a text, a group of named entries (a dictionary in entry
// order) or a list (an array of the children, whose names are ignored). objectTree turns top-level entries
// into the dictionary that a blob carries; buildObjectBlob serialises any tree as an XML or a binary property
// list. A tree that cannot be serialised yields an empty blob. Nothing here knows how the blob is shown.
#pragma once

#include <string>
#include <vector>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

enum class ObjectBlobEncoding { Xml, Binary };

struct ObjectEntry {
    enum class Kind { Text, Group, List };
    Kind kind = Kind::Text;
    std::string name;
    std::string text;
    std::vector<ObjectEntry> children;
};

ObjectEntry objectText(std::string name, std::string text);
ObjectEntry objectGroup(std::string name, std::vector<ObjectEntry> children);
ObjectEntry objectList(std::string name, std::vector<ObjectEntry> children);

PlistValue objectTree(const std::vector<ObjectEntry>& entries);
PlistData buildObjectBlob(const PlistValue& tree, ObjectBlobEncoding encoding);
PlistData buildObjectBlob(const std::vector<ObjectEntry>& entries, ObjectBlobEncoding encoding);

}  // namespace velmar

#include "logfile/records/ObjectBlobRecords.h"

#include "core/platform/plist/PlistCodec.h"

namespace velmar {

namespace {

PlistValue entryValue(const ObjectEntry& entry) {
    switch (entry.kind) {
        case ObjectEntry::Kind::Text:
            return PlistValue(entry.text);
        case ObjectEntry::Kind::Group:
            return objectTree(entry.children);
        case ObjectEntry::Kind::List: {
            auto list = PlistArray::create();
            list->reserve(entry.children.size());
            for (const ObjectEntry& child : entry.children) {
                list->append(entryValue(child));
            }
            return list;
        }
    }
    return PlistValue();
}

}  // namespace

ObjectEntry objectText(std::string name, std::string text) {
    return ObjectEntry{ObjectEntry::Kind::Text, std::move(name), std::move(text), {}};
}

ObjectEntry objectGroup(std::string name, std::vector<ObjectEntry> children) {
    return ObjectEntry{ObjectEntry::Kind::Group, std::move(name), {}, std::move(children)};
}

ObjectEntry objectList(std::string name, std::vector<ObjectEntry> children) {
    return ObjectEntry{ObjectEntry::Kind::List, std::move(name), {}, std::move(children)};
}

PlistValue objectTree(const std::vector<ObjectEntry>& entries) {
    auto group = PlistDictionary::create();
    group->reserve(entries.size());
    for (const ObjectEntry& entry : entries) {
        group->set(entry.name, entryValue(entry));
    }
    return group;
}

PlistData buildObjectBlob(const PlistValue& tree, ObjectBlobEncoding encoding) {
    std::optional<PlistData> bytes =
        encoding == ObjectBlobEncoding::Xml ? serializeXml(tree) : serializeBinary(tree);
    return bytes ? std::move(*bytes) : PlistData();
}

PlistData buildObjectBlob(const std::vector<ObjectEntry>& entries, ObjectBlobEncoding encoding) {
    return buildObjectBlob(objectTree(entries), encoding);
}

}  // namespace velmar

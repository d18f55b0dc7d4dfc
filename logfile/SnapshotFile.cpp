#include "logfile/SnapshotFile.h"

#include "core/platform/BasebandPacket.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/DlfFile.h"
#include "logfile/LogByteStream.h"

namespace velmar {

namespace {

// Splits one entry's raw data into blobs. Answers false when the callback asked to stop; a damaged part
// ends the splitting with the reason in problem.
bool splitDisplayState(std::span<const std::uint8_t> data, std::size_t entry, const LogItemCallback& callback,
                       LogReadStats& stats, std::string& problem) {
    std::size_t offset = 0;
    while (offset < data.size()) {
        const std::size_t left = data.size() - offset;
        const auto where = [&offset] { return "offset " + std::to_string(offset) + ": "; };
        const BasebandPacket framed = frameBasebandPacket(data.subspan(offset));
        if (!framed.hasRecordLength()) {
            problem = where() + std::to_string(left) +
                      (left == 1 ? " trailing byte is" : " trailing bytes are") + " too few for a blob";
            return true;
        }
        const std::size_t prefix = framed.prefixLength;
        const std::size_t length = framed.recordLength;
        if (length < kDlfHeaderSize) {
            problem = where() + "record length " + std::to_string(length) + " is shorter than the " +
                      std::to_string(kDlfHeaderSize) + "-byte header";
            return true;
        }
        const std::size_t size = prefix + 1 + length;
        if (size > left) {
            problem = where() + "blob of " + std::to_string(size) + " bytes runs past the end of the data (" +
                      std::to_string(left) + " bytes left)";
            return true;
        }
        LogItemView item;
        item.bytes = data.subspan(offset, size);
        item.entry = entry;
        item.offset = offset;
        ++stats.blobs;
        offset += size;
        if (!callback(item)) {
            return false;
        }
    }
    return true;
}

}  // namespace

bool scanSnapshotValue(const PlistValue& root, const std::string& name, const LogItemCallback& callback,
                       std::string& error, LogReadStats* stats) {
    LogReadStats ignored;
    LogReadStats& counts = stats != nullptr ? *stats : ignored;
    const PlistDictionaryRef& dictionary = root.dictionary();
    if (!dictionary) {
        error = name + ": the snapshot's root is not a dictionary (" + std::string(root.typeName()) + ")";
        return false;
    }
    const PlistValue* data = dictionary->find("Data");
    if (data == nullptr || !data->isArray()) {
        error = name + ": the snapshot has no \"Data\" array";
        return false;
    }
    std::size_t entry = 0;
    for (const PlistValue& value : *data->array()) {
        ++entry;
        const PlistDictionaryRef& fields = value.dictionary();
        if (!fields) {
            continue;
        }
        const PlistValue* state = fields->find("DisplayState");
        if (state == nullptr || !state->isData()) {
            continue;
        }
        const PlistData& raw = *state->dataValue();
        ++counts.entries;
        std::string problem;
        if (!splitDisplayState(raw, entry, callback, counts, problem)) {
            return true;
        }
        if (!problem.empty()) {
            ++counts.badEntries;
            std::string message = name + ": entry " + std::to_string(entry) + ": " + problem;
            SystemLog::log(kLogWarning, "%s", message.c_str());
            counts.addProblem(std::move(message));
        }
        LogItemView tick;
        tick.kind = LogItem::Kind::Tick;
        tick.entry = entry;
        tick.offset = raw.size();
        ++counts.ticks;
        if (!callback(tick)) {
            return true;
        }
    }
    return true;
}

LogReadResult parseSnapshotValue(const PlistValue& root, const std::string& name) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return scanSnapshotValue(root, name, callback, error, stats);
    });
}

bool scanSnapshotStream(LogByteStream& stream, const std::string& name, const LogItemCallback& callback,
                        std::string& error, LogReadStats* stats) {
    // A property list parses only whole: gather it, up to the limit.
    PlistData whole;
    while (true) {
        if (!stream.fill(1)) {
            error = name + ": " + stream.failure().reason();
            return false;
        }
        const std::span<const std::uint8_t> bytes = stream.available();
        if (bytes.empty()) {
            break;
        }
        if (whole.size() + bytes.size() > kMaxSnapshotBytes) {
            error = name + ": larger than " + std::to_string(kMaxSnapshotBytes / (1024 * 1024)) +
                    " MiB, more than a snapshot holds";
            return false;
        }
        whole.insert(whole.end(), bytes.begin(), bytes.end());
        stream.consume(bytes.size());
    }
    std::string reason;
    const std::optional<PlistValue> root = parsePropertyList(whole, &reason);
    whole = PlistData();
    if (!root) {
        error = name + ": " + (reason.empty() ? std::string("not a property list") : reason);
        return false;
    }
    return scanSnapshotValue(*root, name, callback, error, stats);
}

bool forEachSnapshotItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                         LogReadStats* stats) {
    LogByteStream stream;
    if (const FileOutcome opened = stream.open(path); !opened.ok()) {
        error = path + ": " + opened.reason();
        return false;
    }
    return scanSnapshotStream(stream, path, callback, error, stats);
}

LogReadResult readSnapshotFile(const std::string& path) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return forEachSnapshotItem(path, callback, error, stats);
    });
}

}  // namespace velmar

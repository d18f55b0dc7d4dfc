#include "core/ValueHistory.h"

#include <algorithm>
#include <cmath>

#include "core/NumericValue.h"

namespace velmar {

namespace {
double newestTimeOf(const ValueSeries& series) {
    return series.empty() ? -HUGE_VAL : series.newest().time;
}
}  // namespace

bool isNumericLeaf(const VelmarModelNode* node) {
    const std::string* value = node != nullptr && node->childNodes() == nullptr ? node->value() : nullptr;
    return value != nullptr && parseNumericValue(*value).has_value();
}

std::size_t ValueSeries::firstIndexAtOrAfter(double time) const {
    std::size_t low = 0;
    std::size_t high = count_;
    while (low < high) {
        const std::size_t middle = low + (high - low) / 2;
        if (at(middle).time < time) {
            low = middle + 1;
        } else {
            high = middle;
        }
    }
    return low;
}

ValueHistory::ValueHistory() : ValueHistory(Limits{}) {}

ValueHistory::ValueHistory(Limits limits)
    : limits_(limits),
      samplesPerSeries_(static_cast<std::size_t>(std::ceil(std::max(0.0, limits.windowSeconds) /
                                                           std::max(0.001, limits.intervalSeconds))) +
                        1) {}

std::size_t ValueHistory::bookkeepingBytes(std::size_t pathLength) {
    // The map's node (key, series, next pointer, cached hash), its bucket, and the path's own allocation
    // where it does not fit in the string.
    const std::size_t pathBytes = pathLength >= sizeof(std::string) ? pathLength + 1 : 0;
    return sizeof(SeriesMap::value_type) + 3 * sizeof(void*) + pathBytes;
}

std::size_t ValueHistory::bytesOfFullSeries(std::size_t pathLength) const {
    return bookkeepingBytes(pathLength) + samplesPerSeries_ * sizeof(ValueSample);
}

void ValueHistory::clear() {
    series_.clear();
    bytes_ = 0;
    newestTime_ = 0.0;
}

const ValueSeries* ValueHistory::series(const std::string& path) const {
    const auto found = series_.find(path);
    return found == series_.end() ? nullptr : &found->second;
}

void ValueHistory::erase(SeriesMap::iterator entry) {
    bytes_ -= bookkeepingBytes(entry->first.size()) + entry->second.capacity() * sizeof(ValueSample);
    series_.erase(entry);
}

void ValueHistory::forgetStaleSeries(double time) {
    const double oldest = time - limits_.windowSeconds;
    for (auto entry = series_.begin(); entry != series_.end();) {
        if (newestTimeOf(entry->second) < oldest) {
            const auto stale = entry++;
            erase(stale);
        } else {
            ++entry;
        }
    }
}

bool ValueHistory::makeRoom(std::size_t bytes) {
    while (bytes_ + bytes > limits_.maxBytes) {
        if (currentSeries_ >= series_.size()) {
            return false;  // every series is in the tree being sampled
        }
        auto stalest = series_.end();
        for (auto entry = series_.begin(); entry != series_.end(); ++entry) {
            if (entry->second.seenTick_ == tick_) {
                continue;  // in the tree being sampled
            }
            if (stalest == series_.end() || newestTimeOf(entry->second) < newestTimeOf(stalest->second)) {
                stalest = entry;
            }
        }
        if (stalest == series_.end()) {
            return false;
        }
        erase(stalest);
    }
    return true;
}

bool ValueHistory::grow(ValueSeries& series) {
    const std::size_t capacity = series.ring_.size();
    const std::size_t grown = std::min(samplesPerSeries_, std::max(kInitialSamples, capacity * 2));
    if (grown <= capacity || !makeRoom((grown - capacity) * sizeof(ValueSample))) {
        return false;
    }
    std::vector<ValueSample> ring;
    ring.reserve(grown);
    for (std::size_t i = 0; i < series.count_; ++i) {
        ring.push_back(series.at(i));
    }
    ring.resize(grown);
    series.ring_.swap(ring);
    series.start_ = 0;
    bytes_ += (grown - capacity) * sizeof(ValueSample);
    return true;
}

void ValueHistory::append(const Reading& reading, double time) {
    ValueSeries* series = reading.series;
    if (series == nullptr) {
        if (!makeRoom(bookkeepingBytes(reading.path->size()) + kInitialSamples * sizeof(ValueSample))) {
            ++dropped_;
            return;
        }
        const auto entry = series_.try_emplace(*reading.path).first;
        series = &entry->second;
        series->seenTick_ = tick_;
        ++currentSeries_;
        bytes_ += bookkeepingBytes(reading.path->size());
        if (!grow(*series)) {
            erase(entry);  // not reached: the room was made above
            --currentSeries_;
            ++dropped_;
            return;
        }
    }
    series->unit_ = reading.unit;
    series->decimals_ = reading.decimals;
    const ValueSample sample{time, reading.value};
    if (series->count_ == series->ring_.size() && !grow(*series)) {
        // Full and not allowed to grow: the oldest sample makes way.
        series->ring_[series->start_] = sample;
        series->start_ = (series->start_ + 1) % series->ring_.size();
        return;
    }
    series->ring_[(series->start_ + series->count_) % series->ring_.size()] = sample;
    ++series->count_;
}

void ValueHistory::sample(const NodePathDictionary& nodes, double time) {
    if (!std::isfinite(time) || samplesPerSeries_ == 0) {
        return;
    }
    if (time < newestTime_) {
        clear();
    }
    newestTime_ = time;
    ++tick_;
    currentSeries_ = 0;
    forgetStaleSeries(time);
    // First every numeric leaf and its series, marked as current so that making room spares them; then the
    // appends, which may allocate.
    readings_.clear();
    for (const auto& [path, node] : nodes) {
        const std::string* text = node ? node->value() : nullptr;
        if (text == nullptr) {
            continue;
        }
        const std::optional<NumericValue> number = parseNumericValue(*text);
        if (!number) {
            continue;
        }
        ValueSeries* series = nullptr;
        if (const auto found = series_.find(path); found != series_.end()) {
            series = &found->second;
            series->seenTick_ = tick_;
            ++currentSeries_;
        }
        readings_.push_back({&path, series, number->value, number->unit, number->decimals});
    }
    for (const Reading& reading : readings_) {
        append(reading, time);
    }
}

}  // namespace velmar

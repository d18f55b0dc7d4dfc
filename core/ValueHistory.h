// ValueHistory: the recent values of every numeric leaf of the display, by display path, for the charts.
//
// Contract: sample() takes one display tree (its path dictionary) and a wall-clock time, and appends the
// value of every leaf that reads as a number (NumericValue) to the series of the leaf's path, with its unit.
// Each series is a ring of at most samplesPerSeries() samples, enough for the window (one hour by default)
// at the display interval (2 s); its oldest sample goes first. Series grow as they fill, so a path seen for
// a minute costs a minute of samples. Memory is capped: bytes() counts each series' samples, its path and
// its bookkeeping, and never exceeds Limits::maxBytes. When an allocation would pass the cap, the series
// that was not in the tree being sampled and was updated longest ago goes first; when every series is
// current, a growing series keeps the samples it has room for (its oldest go first) and a new path is not
// recorded (droppedSamples() counts it). A series not updated for a whole window is forgotten. A time
// earlier than the newest one (a wall clock stepped back) clears the history first, so that times within a
// series never decrease. clear() forgets everything (the model does so when the technology changes).
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "core/VelmarModelNode.h"

namespace velmar {

struct ValueSample {
    double time;  // seconds since 1970
    double value;
};

class ValueSeries {
  public:
    // "" for plain numbers; the unit of the newest sample.
    std::string_view unit() const { return unit_; }
    // The digits after the point of the newest sample as the display printed it.
    int decimals() const { return decimals_; }
    std::size_t size() const { return count_; }
    bool empty() const { return count_ == 0; }
    // Oldest first: at(0) is the oldest sample kept, at(size() - 1) the newest.
    const ValueSample& at(std::size_t index) const { return ring_[(start_ + index) % ring_.size()]; }
    const ValueSample& newest() const { return at(count_ - 1); }
    // Index of the first sample at or after time (size() when there is none).
    std::size_t firstIndexAtOrAfter(double time) const;
    std::size_t capacity() const { return ring_.size(); }

  private:
    friend class ValueHistory;
    // ring_ holds capacity() slots; count_ of them, from start_ on (wrapping), are samples.
    std::vector<ValueSample> ring_;
    std::size_t start_ = 0;
    std::size_t count_ = 0;
    std::string_view unit_;
    int decimals_ = 0;
    std::uint64_t seenTick_ = 0;
};

// Whether a node is a leaf whose value reads as a number: what the history samples and the charts draw.
bool isNumericLeaf(const VelmarModelNode* node);

class ValueHistory {
  public:
    struct Limits {
        double windowSeconds = 3600.0;
        double intervalSeconds = 2.0;
        std::size_t maxBytes = 16u << 20;
    };
    // A series starts with room for this many samples and doubles as it fills.
    static constexpr std::size_t kInitialSamples = 16;

    ValueHistory();
    explicit ValueHistory(Limits limits);

    // One redraw: every numeric leaf of the tree, at time.
    void sample(const NodePathDictionary& nodes, double time);
    void clear();

    // The series of a display path, or null.
    const ValueSeries* series(const std::string& path) const;
    std::size_t seriesCount() const { return series_.size(); }
    // Memory the history holds, as counted against the cap.
    std::size_t bytes() const { return bytes_; }
    // Memory of one series whose ring is full, for a path of pathLength bytes.
    std::size_t bytesOfFullSeries(std::size_t pathLength) const;
    std::size_t samplesPerSeries() const { return samplesPerSeries_; }
    // The time of the newest sample, 0 before the first.
    double newestTime() const { return newestTime_; }
    // Samples not recorded for want of memory.
    std::size_t droppedSamples() const { return dropped_; }
    const Limits& limits() const { return limits_; }

  private:
    using SeriesMap = std::unordered_map<std::string, ValueSeries>;
    struct Reading {
        const std::string* path;
        ValueSeries* series;  // null for a path without a series yet
        double value;
        std::string_view unit;
        int decimals;
    };

    void forgetStaleSeries(double time);
    void append(const Reading& reading, double time);
    // Frees memory, stalest series first, until bytes more fit; false when they cannot.
    bool makeRoom(std::size_t bytes);
    bool grow(ValueSeries& series);
    void erase(SeriesMap::iterator entry);
    static std::size_t bookkeepingBytes(std::size_t pathLength);

    Limits limits_;
    std::size_t samplesPerSeries_;
    SeriesMap series_;
    std::size_t bytes_ = 0;
    double newestTime_ = 0.0;
    std::uint64_t tick_ = 0;
    std::size_t currentSeries_ = 0;  // series in the tree being sampled
    std::size_t dropped_ = 0;
    std::vector<Reading> readings_;  // scratch of one sample(), kept to spare its allocation
};

}  // namespace velmar

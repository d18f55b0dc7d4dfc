// C2KFerFilter: the filtered frame-error rate of the 1x traffic channel, kept in the state as "TrafficFER".
//
// Contract: a first-order filter of weight 1/64: new = (erasure ? 1 : 0) × 0.015625 + old × 0.984375. From
// 0 it reaches 1/64 after one erased frame and converges toward 1 (100 %) over repeated erasures.
// storedTrafficFer answers the state's "TrafficFER" number (integer or real), or nothing when it holds none.
#pragma once

#include <optional>

#include "core/platform/plist/PlistValue.h"

namespace velmar::c2k {

inline constexpr double kFerNewFrameWeight = 0.015625;  // 1/64
inline constexpr double kFerHistoryWeight = 0.984375;   // 63/64

constexpr double filterFrameErrorRate(double previous, bool erasure) {
    return (erasure ? 1.0 : 0.0) * kFerNewFrameWeight + previous * kFerHistoryWeight;
}

std::optional<double> storedTrafficFer(const PlistDictionary& state);

}  // namespace velmar::c2k

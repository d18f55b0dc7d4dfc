// BlobQueue: the bounded queue of blobs that a log channel could not send yet.
//
// Contract: first in, first out. It holds at most maxBlobs blobs and maxBytes bytes of them; pushing into a
// full queue drops the oldest blobs until the new one fits (a blob larger than maxBytes on its own is kept
// alone). Blobs are copied in; the buffers of sent blobs (small ones, a few at most) are kept for reuse, so a
// busy queue does not allocate per blob. A queue given a QueueBudget counts its bytes in and out of it.
#pragma once

#include <cstddef>
#include <deque>
#include <vector>

#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"
#include "service/QueueBudget.h"

namespace velmar {

class BlobQueue {
  public:
    BlobQueue(std::size_t maxBlobs, std::size_t maxBytes, QueueBudget* budget = nullptr);
    ~BlobQueue();
    BlobQueue(const BlobQueue&) = delete;
    BlobQueue& operator=(const BlobQueue&) = delete;

    // Appends a copy of blob; answers how many old blobs were dropped to make room.
    std::size_t push(ByteView blob);
    ByteView front() const { return blobs_.front(); }
    void pop();
    void clear();

    bool empty() const { return blobs_.empty(); }
    std::size_t size() const { return blobs_.size(); }
    std::size_t bytes() const { return bytes_; }

    // What a queued blob costs beyond its bytes (its vector and the allocator's share), as the budget counts.
    static constexpr std::size_t kBlobOverhead = 64;

  private:
    static constexpr std::size_t kMaxSpares = 16;
    static constexpr std::size_t kMaxSpareCapacity = 4096;

    std::size_t maxBlobs_;
    std::size_t maxBytes_;
    std::size_t bytes_ = 0;
    QueueBudget* budget_;
    std::deque<PlistData> blobs_;
    std::vector<PlistData> spares_;
};

}  // namespace velmar

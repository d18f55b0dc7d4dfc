#include "service/BlobQueue.h"

#include <algorithm>

namespace velmar {

BlobQueue::BlobQueue(std::size_t maxBlobs, std::size_t maxBytes, QueueBudget* budget)
    : maxBlobs_(std::max<std::size_t>(maxBlobs, 1)), maxBytes_(maxBytes), budget_(budget) {}

BlobQueue::~BlobQueue() {
    clear();
}

std::size_t BlobQueue::push(ByteView blob) {
    std::size_t dropped = 0;
    while (!blobs_.empty() && (blobs_.size() >= maxBlobs_ || bytes_ + blob.size() > maxBytes_)) {
        pop();
        ++dropped;
    }
    PlistData copy;
    if (!spares_.empty()) {
        copy = std::move(spares_.back());
        spares_.pop_back();
    }
    copy.assign(blob.begin(), blob.end());
    bytes_ += copy.size();
    if (budget_ != nullptr) {
        budget_->add(copy.size() + kBlobOverhead);
    }
    blobs_.push_back(std::move(copy));
    return dropped;
}

void BlobQueue::pop() {
    PlistData& oldest = blobs_.front();
    bytes_ -= oldest.size();
    if (budget_ != nullptr) {
        budget_->remove(oldest.size() + kBlobOverhead);
    }
    if (spares_.size() < kMaxSpares && oldest.capacity() <= kMaxSpareCapacity) {
        spares_.push_back(std::move(oldest));
    }
    blobs_.pop_front();
}

void BlobQueue::clear() {
    while (!blobs_.empty()) {
        pop();
    }
}

}  // namespace velmar

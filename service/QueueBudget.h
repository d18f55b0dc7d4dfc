// QueueBudget: one limit on the memory that the queues of every log channel take together, so that clients
// that stop reading cannot make the service grow however many of them there are.
//
// Contract: queues count their bytes in (add) and out (remove). enforce(), called after a queue grew, makes
// the member furthest behind shed its oldest blobs until the total is within the limit again: of the members
// whose clients have stopped reading, the one holding the most bytes; when no such member holds any, the one
// holding the most bytes of all. A client that reads, even one a little behind, thus loses nothing while
// stalled clients hold blobs. The member counts and reports its own losses. Members join while they exist
// and leave before they go.
#pragma once

#include <cstddef>
#include <vector>

namespace velmar {

class QueueBudget {
  public:
    class Member {
      public:
        virtual ~Member() = default;
        virtual std::size_t queuedBytes() const = 0;
        // Whether the member's client has stopped taking what is queued for it.
        virtual bool clientStalled() const = 0;
        // Drops the member's oldest queued blob; false when it holds none.
        virtual bool shedOldest() = 0;
    };

    explicit QueueBudget(std::size_t limitBytes) : limit_(limitBytes) {}
    QueueBudget(const QueueBudget&) = delete;
    QueueBudget& operator=(const QueueBudget&) = delete;

    void join(Member& member);
    void leave(Member& member);
    void add(std::size_t bytes) { used_ += bytes; }
    void remove(std::size_t bytes) { used_ -= bytes < used_ ? bytes : used_; }
    void enforce();

    std::size_t used() const { return used_; }
    std::size_t limit() const { return limit_; }

  private:
    std::size_t limit_;
    std::size_t used_ = 0;
    std::vector<Member*> members_;
};

}  // namespace velmar

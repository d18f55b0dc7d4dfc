// VersionAdaptingSink: where every blob of the service's baseband source enters, on its way to the log
// channels: it rewrites records of newer firmware versions into the layouts the monitor decodes
// (logfile/PacketVersionAdapter.h), as the platform does on a phone, and keeps the census of what it saw.
//
// Contract: deliver() hands the channels the adapted blob, or the source's very blob when nothing was to be
// adapted; canTakeMore(), notifyWhenReady() and the streaming demand are the channels'. The first record
// of each (log code, version) that the adapter does not know is logged at warning priority with its code,
// version and length. logCensus() writes the census at notice priority, one line per (code, version).
#pragma once

#include <functional>
#include <utility>

#include "logfile/PacketCensus.h"
#include "logfile/PacketVersionAdapter.h"
#include "service/BasebandSource.h"

namespace velmar {

class VersionAdaptingSink : public BlobSink {
  public:
    explicit VersionAdaptingSink(BlobSink& channels) : channels_(channels) {}

    void deliver(const BasebandBlob& blob) override;
    bool canTakeMore() const override { return channels_.canTakeMore(); }
    void notifyWhenReady(std::function<void()> ready) override {
        channels_.notifyWhenReady(std::move(ready));
    }
    // Adapting keeps every record's code: the demand is the channels'.
    LogCodeFilter streamingDemand() const override { return channels_.streamingDemand(); }
    void observeStreamingDemand(std::function<void()> changed) override {
        channels_.observeStreamingDemand(std::move(changed));
    }

    void logCensus() const;
    const PacketCensus& census() const { return census_; }

  private:
    BlobSink& channels_;
    PacketVersionAdapter adapter_;
    PacketCensus census_;
};

}  // namespace velmar

// Requests matched with responses one at a time: answers among log packets, retries after a timeout, the
// late answer of an abandoned attempt, error responses, and frames that answer nothing.
#include "service/live/DiagRequests.h"

#include <gtest/gtest.h>

#include <vector>

#include "core/platform/PollMainQueue.h"
#include "logfile/DiagFraming.h"
#include "service/live/DiagCommands.h"

namespace velmar::live {
namespace {

using Bytes = std::vector<std::uint8_t>;

constexpr double kResponseSeconds = 0.05;

class DiagRequestsTest : public ::testing::Test {
  protected:
    struct Result {
        DiagRequests::Outcome outcome;
        Bytes response;
    };

    DiagRequests::Done keep() {
        return [this](DiagRequests::Outcome outcome, ByteView response) {
            results_.push_back(Result{outcome, Bytes(response.begin(), response.end())});
        };
    }
    static Bytes framed(const Bytes& payload) {
        Bytes out;
        appendDiagFrame(out, payload);
        return out;
    }

    PollMainQueue queue_;
    std::vector<Bytes> written_;
    DiagRequests requests_{queue_,
                           [this](ByteView frame) {
                               written_.emplace_back(frame.begin(), frame.end());
                               return true;
                           },
                           kResponseSeconds};
    std::vector<Result> results_;
};

TEST_F(DiagRequestsTest, RequestsGoOutOneAtATimeAndTheirAnswersComeBackAmongLogPackets) {
    requests_.submit(versionRequest(), 2, keep());
    requests_.submit(buildIdRequest(), 2, keep());
    ASSERT_EQ(written_.size(), 1U);
    EXPECT_EQ(written_[0], framed(versionRequest()));
    EXPECT_EQ(requests_.offer(Bytes{0x7C, 0x01}), DiagRequests::Offer::Unmatched) << "not asked yet";
    EXPECT_EQ(requests_.offer(Bytes{0x00, 'v'}), DiagRequests::Offer::Matched);
    ASSERT_EQ(written_.size(), 2U);
    EXPECT_EQ(written_[1], framed(buildIdRequest()));
    EXPECT_EQ(requests_.offer(Bytes{0x7C, 0x01}), DiagRequests::Offer::Matched);
    ASSERT_EQ(results_.size(), 2U);
    EXPECT_EQ(results_[0].outcome, DiagRequests::Outcome::Answered);
    EXPECT_EQ(results_[0].response, (Bytes{0x00, 'v'}));
    EXPECT_EQ(results_[1].response, (Bytes{0x7C, 0x01}));
    EXPECT_TRUE(requests_.idle());
}

TEST_F(DiagRequestsTest, ARequestWithoutAnswerIsSentAgainThenGivenUp) {
    requests_.submit(versionRequest(), 2, keep());
    ASSERT_TRUE(queue_.runUntil([&] { return !results_.empty(); }, 5));
    EXPECT_EQ(written_.size(), 2U);
    EXPECT_EQ(written_[0], written_[1]);
    EXPECT_EQ(results_[0].outcome, DiagRequests::Outcome::TimedOut);
    EXPECT_TRUE(results_[0].response.empty());
    // Both attempts may still be answered late; those answers are expected, a third is not.
    EXPECT_EQ(requests_.offer(Bytes{0x00, 'v'}), DiagRequests::Offer::Late);
    EXPECT_EQ(requests_.offer(Bytes{0x00, 'v'}), DiagRequests::Offer::Late);
    EXPECT_EQ(requests_.offer(Bytes{0x00, 'v'}), DiagRequests::Offer::Unmatched);
}

TEST_F(DiagRequestsTest, ASecondAttemptsAnswerEndsTheRequestAndTheFirstsAnswerIsLate) {
    requests_.submit(logConfigRequest(LogConfigOperation::DisableAll), 3, keep());
    ASSERT_TRUE(queue_.runUntil([&] { return written_.size() == 2; }, 5));
    const Bytes answer = {0x73, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0};
    EXPECT_EQ(requests_.offer(answer), DiagRequests::Offer::Matched);
    ASSERT_EQ(results_.size(), 1U);
    EXPECT_EQ(results_[0].outcome, DiagRequests::Outcome::Answered);
    EXPECT_EQ(requests_.offer(answer), DiagRequests::Offer::Late);
    EXPECT_EQ(requests_.offer(answer), DiagRequests::Offer::Unmatched);
    queue_.runFor(3 * kResponseSeconds);
    EXPECT_EQ(written_.size(), 2U) << "nothing is sent again once answered";
}

TEST_F(DiagRequestsTest, AnErrorResponseEndsTheRequestAsRefused) {
    const Bytes request = logConfigRequest(LogConfigOperation::RetrieveRanges);
    requests_.submit(request, 3, keep());
    Bytes refusal = {0x14};
    refusal.insert(refusal.end(), request.begin(), request.end());
    EXPECT_EQ(requests_.offer(Bytes{0x13, 0x7C}), DiagRequests::Offer::Unmatched)
        << "refuses another request";
    EXPECT_EQ(requests_.offer(refusal), DiagRequests::Offer::Matched);
    ASSERT_EQ(results_.size(), 1U);
    EXPECT_EQ(results_[0].outcome, DiagRequests::Outcome::ErrorResponse);
    EXPECT_EQ(results_[0].response, refusal);
}

TEST_F(DiagRequestsTest, CancellingDropsEveryRequestWithoutCallingBack) {
    requests_.submit(versionRequest(), 2, keep());
    requests_.submit(buildIdRequest(), 2, keep());
    requests_.cancelAll();
    EXPECT_TRUE(requests_.idle());
    queue_.runFor(3 * kResponseSeconds);
    EXPECT_TRUE(results_.empty());
    EXPECT_EQ(written_.size(), 1U);
    EXPECT_EQ(requests_.offer(Bytes{0x00, 'v'}), DiagRequests::Offer::Unmatched);
}

TEST_F(DiagRequestsTest, ACallbackMaySubmitTheNextStep) {
    requests_.submit(versionRequest(), 1, [this](DiagRequests::Outcome, ByteView) {
        requests_.submit(buildIdRequest(), 1, keep());
    });
    EXPECT_EQ(requests_.offer(Bytes{0x00}), DiagRequests::Offer::Matched);
    ASSERT_EQ(written_.size(), 2U);
    EXPECT_EQ(requests_.offer(Bytes{0x7C}), DiagRequests::Offer::Matched);
    EXPECT_EQ(results_.size(), 1U);
}

}  // namespace
}  // namespace velmar::live

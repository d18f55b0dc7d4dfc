// The decoder tables of the three class indexes: each decoder answers exactly its row, and the live map that
// velmar-decode --list-decoders prints is the index's own dispatch.
#include <gtest/gtest.h>

#include <memory>
#include <span>
#include <string>
#include <vector>

#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/UTRAN/UTRANClassIndex.h"

namespace velmar {
namespace {

struct TechnologyTable {
    const char* name;
    std::span<const DecoderRow> rows;
    std::unique_ptr<ClassIndex> (*create)();
};

template <typename Index>
std::unique_ptr<ClassIndex> makeIndex() {
    return std::make_unique<Index>();
}

const TechnologyTable kTables[] = {
    {"gsm", kGsmDecoders, &makeIndex<ORV_GSMClassIndex>},
    {"lte", kLteDecoders, &makeIndex<LTEClassIndex>},
    {"utran", kUtranDecoders, &makeIndex<UTRANClassIndex>},
};

std::vector<std::int32_t> codesOf(const DecoderRow& row) {
    return std::vector<std::int32_t>(row.codes.codes().begin(), row.codes.codes().end());
}

TEST(DecoderTable, EveryDecoderAnswersItsRowsSectionAndCodes) {
    for (const TechnologyTable& table : kTables) {
        for (const DecoderRow& row : table.rows) {
            ClassDictionary classDict;
            CodeDictionary codeDict;
            const DecoderRef decoder = row.create(classDict, codeDict);
            ASSERT_NE(decoder, nullptr) << table.name << " " << row.decoder;
            EXPECT_EQ(decoder->getSectionName(), row.section) << row.decoder;
            const LogCodeArray codes = decoder->getLogCodeArray();
            if (row.codes.codes().empty()) {
                EXPECT_EQ(codes, std::nullopt) << row.decoder;
            } else {
                EXPECT_EQ(codes, LogCodeArray(codesOf(row))) << row.decoder;
            }
            // Creation registers the decoder under its section and each of its codes.
            EXPECT_EQ(classDict.size(), 1u);
            EXPECT_EQ(codeDict.size(), row.codes.codes().size()) << row.decoder;
        }
    }
}

TEST(DecoderTable, SubscriptionsAreTheIndexsOwnDispatchInOrder) {
    for (const TechnologyTable& table : kTables) {
        const std::unique_ptr<ClassIndex> index = table.create();
        // The map rebuilt from the index's public lookups: every code, each subscriber by its section.
        std::vector<std::pair<std::string, std::string>> dispatched;
        for (const std::string& code : index->getAllLogCodes()) {
            for (const DecoderRef& decoder : *index->getSubscribers(std::stoi(code))) {
                dispatched.emplace_back(code, std::string(decoder->getSectionName()));
            }
        }
        std::vector<std::pair<std::string, std::string>> listed;
        std::size_t withoutCodes = 0;
        for (const ClassIndex::Subscription& subscription : index->subscriptions()) {
            ASSERT_NE(subscription.row, nullptr);
            if (!subscription.code) {
                ++withoutCodes;
                EXPECT_TRUE(subscription.row->codes.codes().empty()) << subscription.row->decoder;
                EXPECT_NE(index->getClass(subscription.row->section), nullptr);
                continue;
            }
            EXPECT_EQ(withoutCodes, 0u) << "decoders without codes come last";
            listed.emplace_back(std::to_string(*subscription.code), std::string(subscription.row->section));
        }
        EXPECT_EQ(listed, dispatched) << table.name;
        std::size_t rowsWithoutCodes = 0;
        for (const DecoderRow& row : table.rows) {
            rowsWithoutCodes += row.codes.codes().empty() ? 1 : 0;
        }
        EXPECT_EQ(withoutCodes, rowsWithoutCodes) << table.name;
    }
}

TEST(DecoderTable, SharedDecodersUseOneRowInEveryTable) {
    for (const TechnologyTable& table : kTables) {
        std::size_t sharedRows = 0;
        for (const DecoderRow& row : table.rows) {
            if (row.create == kSimInfoRow.create || row.create == kPDPContextListRow.create) {
                ++sharedRows;
                const DecoderRow& shared =
                    row.create == kSimInfoRow.create ? kSimInfoRow : kPDPContextListRow;
                EXPECT_EQ(row.section, shared.section);
                EXPECT_EQ(codesOf(row), codesOf(shared));
            }
        }
        EXPECT_EQ(sharedRows, 2u) << table.name;
    }
}

TEST(DecoderTable, RowsAreFoundByDecoderClassName) {
    constexpr const DecoderRow& detected = rowOf(kLteDecoders, "DetectedCells");
    EXPECT_EQ(detected.section, "Detected Cells");
    EXPECT_EQ(std::string(detected.decoder), "DetectedCells");
    EXPECT_EQ(&rowOf(kUtranDecoders, "CCTRCHSIRMeasurement"), &kUtranDecoders[5]);
    EXPECT_EQ(&rowOf(kGsmDecoders, "HSDPAInformation"), &kGsmDecoders[25]);
}

TEST(DecoderTable, ARowWithoutCodesHasANullCodeArray) {
    EXPECT_EQ(LogCodeList{}.toArray(), std::nullopt);
    EXPECT_EQ((LogCodeList{0x4005, 0xFF0001}.toArray()),
              (LogCodeArray{std::vector<std::int32_t>{0x4005, 0xFF0001}}));
}

}  // namespace
}  // namespace velmar

#include "service/modem-manager/LteBandOfEarfcn.h"

#include <algorithm>
#include <iterator>

namespace velmar::modem {
namespace {

struct DownlinkRange {
    std::int64_t band;
    std::int64_t first;
    std::int64_t last;
};

// Downlink EARFCN ranges of the E-UTRA operating bands, in increasing order of EARFCN. Band 29, 32, 46, 67,
// 69, 75 and 76 are downlink-only supplements; they still name the band the cell transmits in.
constexpr DownlinkRange kDownlinkRanges[] = {
    {1, 0, 599},        {2, 600, 1199},     {3, 1200, 1949},    {4, 1950, 2399},    {5, 2400, 2649},
    {6, 2650, 2749},    {7, 2750, 3449},    {8, 3450, 3799},    {9, 3800, 4149},    {10, 4150, 4749},
    {11, 4750, 4949},   {12, 5010, 5179},   {13, 5180, 5279},   {14, 5280, 5379},   {17, 5730, 5849},
    {18, 5850, 5999},   {19, 6000, 6149},   {20, 6150, 6449},   {21, 6450, 6599},   {22, 6600, 7399},
    {23, 7500, 7699},   {24, 7700, 8039},   {25, 8040, 8689},   {26, 8690, 9039},   {27, 9040, 9209},
    {28, 9210, 9659},   {29, 9660, 9769},   {30, 9770, 9869},   {31, 9870, 9919},   {32, 9920, 10359},
    {33, 36000, 36199}, {34, 36200, 36349}, {35, 36350, 36949}, {36, 36950, 37549}, {37, 37550, 37749},
    {38, 37750, 38249}, {39, 38250, 38649}, {40, 38650, 39649}, {41, 39650, 41589}, {42, 41590, 43589},
    {43, 43590, 45589}, {44, 45590, 46589}, {45, 46590, 46789}, {46, 46790, 54539}, {47, 54540, 55239},
    {48, 55240, 56739}, {49, 56740, 58239}, {50, 58240, 59089}, {51, 59090, 59139}, {52, 59140, 60139},
    {53, 60140, 60254}, {65, 65536, 66435}, {66, 66436, 67335}, {67, 67336, 67535}, {68, 67536, 67835},
    {69, 67836, 68335}, {70, 68336, 68585}, {71, 68586, 68935}, {72, 68936, 68985}, {73, 68986, 69035},
    {74, 69036, 69465}, {75, 69466, 70315}, {76, 70316, 70365}, {85, 70366, 70545}, {87, 70546, 70595},
    {88, 70596, 70645},
};

}  // namespace

std::optional<std::int64_t> lteBandOfEarfcn(std::int64_t earfcn) {
    // The first range whose last number is not below earfcn is the only one that can hold it.
    const auto range =
        std::lower_bound(std::begin(kDownlinkRanges), std::end(kDownlinkRanges), earfcn,
                         [](const DownlinkRange& r, std::int64_t value) { return r.last < value; });
    if (range == std::end(kDownlinkRanges) || earfcn < range->first) {
        return std::nullopt;
    }
    return range->band;
}

}  // namespace velmar::modem

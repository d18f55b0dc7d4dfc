#include "LogGenerator/Base.h"

#include <string>

#include "LogGenerator/LogCodeKey.h"
#include "LogGenerator/NotImplementedError.h"
#include "core/ArrayLock.h"
#include "core/platform/SystemLog.h"

namespace velmar {

void Base::updateSectionRef(const PlistValue& container) {
    sectionRef.dictionary = container.dictionary();
    sectionRef.array = container.array();
    if (SystemLog::isEnabled(kLogWarning)) {
        const std::string name(getSectionName());
        SystemLog::log(kLogWarning, "%s", name.c_str());
    }
}

void Base::updateWithData(ByteView, std::int32_t) {
    throw NotImplementedError("updateWithData:logCode:");
}
std::string_view Base::getSectionName() const {
    throw NotImplementedError("getSectionName");
}
LogCodeArray Base::getLogCodeArray() const {
    throw NotImplementedError("getLogCodeArray");
}

void Base::updateLogCodeDict(CodeDictionary& codeDict) {
    const LogCodeArray codes = getLogCodeArray();
    SystemLog::log(kLogWarning, "Array Count: %d", codes ? static_cast<int>(codes->size()) : 0);
    if (!codes) {
        return;
    }
    for (const std::int32_t code : *codes) {
        codeDict.findOrInsert(LogCodeKey(code).view()).push_back(shared_from_this());
    }
}

void Base::clearElementsInArray(const PlistArrayRef& array) {
    ArrayLock::lockArray();
    if (array) {
        array->clear();
    }
    ArrayLock::unlockArray();
}

void Base::replaceArray(const PlistArrayRef& array, const PlistArrayRef& with) {
    ArrayLock::lockArray();
    if (array) {
        array->clear();
        if (with) {
            array->items().insert(array->items().end(), with->items().begin(), with->items().end());
        }
    }
    ArrayLock::unlockArray();
}

std::int16_t Base::lookUpECNO(std::uint32_t v) {
    // Thresholds tested from the top; the first that holds decides. Both -31 rows and the final 0 are kept.
    struct Threshold {
        std::uint32_t bound;
        bool inclusive;  // v >= bound rather than v > bound
        std::int16_t decibels;
    };
    static constexpr Threshold kThresholds[] = {
        {524288, true, 0},   {417647, false, -1}, {331808, false, -2}, {263624, false, -3},
        {209463, false, -4}, {166441, false, -5}, {132268, false, -6}, {105123, false, -7},
        {83562, false, -8},  {66435, false, -9},  {52830, false, -10}, {42023, false, -11},
        {33440, false, -12}, {26621, false, -13}, {21205, false, -14}, {16904, true, -15},
        {13486, false, -16}, {10772, true, -17},  {8616, true, -18},   {6902, false, -19},
        {5542, false, -20},  {4462, true, -21},   {3603, false, -22},  {2921, false, -23},
        {2240, false, -24},  {1949, false, -25},  {1607, false, -26},  {1336, false, -27},
        {1120, false, -28},  {949, false, -29},   {813, false, -30},   {756, false, -31},
        {705, false, -31},
    };
    for (const Threshold& row : kThresholds) {
        if (row.inclusive ? v >= row.bound : v > row.bound) {
            return row.decibels;
        }
    }
    return 0;
}

}  // namespace velmar

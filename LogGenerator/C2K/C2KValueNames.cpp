#include "LogGenerator/C2K/C2KValueNames.h"

namespace velmar::c2k {

namespace {

constexpr ValueName kEvdoDeviceStateRows[] = {
    {0, 0, "Inactive [0]"}, {1, 1, "Acquisition [1]"}, {2, 2, "Sync [2]"},
    {3, 3, "Idle [3]"},     {4, 4, "Access [4]"},      {5, 5, "Connected [5]"},
};

constexpr ValueName kEvdoSessionStateRows[] = {
    {0, 0, "Closed [0]"},        {1, 1, "AMP setup [1]"}, {2, 2, "AT-initiated neg [2]"},
    {3, 3, "Initiated neg [3]"}, {4, 4, "Open [4]"},
};

constexpr ValueName k1xDeviceStateRows[] = {
    {0, 0, "Inactive [0]"},
    {1, 1, "Deep sleep in start state [1]"},
    {2, 2, "Initial state for CDMA operation [2]"},
    {3, 3, "Acquisition [3]"},
    {4, 4, "Sync [4]"},
    {5, 5, "Slew [5]"},
    {6, 6, "Paging [6]"},
    {7, 7, "Slotted mode sleep state [7]"},
    {8, 8, "Traffic [8]"},
    {9, 9, "UnSlew [9]"},
    {10, 10, "Operation in PCG state [10]"},
    {11, 11, "Powerup state [11]"},
};

// "900 MHzband [9]" has no space before "band"; the text is kept exactly as it has always been shown.
constexpr ValueName kBandClassRows[] = {
    {0, 0, "800 MHz cellular band [0]"},
    {1, 1, "1.8 to 2.0GHz PCS band [1]"},
    {2, 2, "872 to 960MHz TACS band [2]"},
    {3, 3, "832 to 925MHz JTACS band [3]"},
    {4, 4, "1.75 to 1.87GHz Korean PCS band [4]"},
    {5, 5, "450MHz band [5]"},
    {6, 6, "2GHz band [6]"},
    {7, 7, "700MHz band [7]"},
    {8, 8, "1800 MHz band [8]"},
    {9, 9, "900 MHzband [9]"},
    {10, 10, "Secondary 800 MHz band [10]"},
    {11, 11, "400 MHz European PAMR band [11]"},
    {12, 12, "800 MHz European PAMR band [12]"},
};

constexpr ValueName kRoamingIndicatorRows[] = {
    {0, 0, "OFF [0]"},
    {1, 1, "ON [1]"},
    {2, 2, "Flashing [2]"},
    {3, 3, "Out of Neighborhood [3]"},
    {4, 4, "Out of Building [4]"},
    {5, 5, "Preferred system [5]"},
    {6, 6, "Available system [6]"},
    {7, 7, "Alliance partner [7]"},
    {8, 8, "Premium partner [8]"},
    {9, 9, "Full service functionality [9]"},
    {10, 10, "Partial service functionality [10]"},
    {11, 11, "Banner ON [11]"},
    {12, 12, "Banner OFF [12]"},
};

}  // namespace

const ValueNames kEvdoDeviceStateNames{kEvdoDeviceStateRows, "[Reserved %d]"};
const ValueNames kEvdoSessionStateNames{kEvdoSessionStateRows, "[Reserved %d]"};
const ValueNames k1xDeviceStateNames{k1xDeviceStateRows, "[Bad Value %d]"};
const ValueNames kBandClassNames{kBandClassRows, "[Bad Value %d]"};
const ValueNames kRoamingIndicatorNames{kRoamingIndicatorRows, "ERI - %d"};

}  // namespace velmar::c2k

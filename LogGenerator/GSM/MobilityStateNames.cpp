#include "LogGenerator/GSM/MobilityStateNames.h"

namespace velmar {

namespace {

constexpr ValueName kRegistrationStateRows[] = {
    {0, 0, "REG_STATE_INACTIVE"},      {1, 1, "REG_STATE_IDLE"},
    {2, 2, "REG_STATE_REGISTERING"},   {3, 3, "REG_STATE_DEREGISTERING"},
    {4, 4, "REG_STATE_MANUAL_SEARCH"}, {5, 5, "REG_STATE_AUTOMATIC_SEARCH"},
    {6, 6, "REG_STATE_OFFLINE"},
};

// Numbered as the MM states of 3GPP TS 24.008, hence the holes (1, 2, 4, 11, 12, 16, 24).
constexpr ValueName kMmStateRows[] = {
    {0, 0, "MM_NULL"},
    {3, 3, "MM_LOCATION_UPDATE_INITIATED"},
    {5, 5, "MM_WAIT_FOR_OUTGOING_MM_CONNECTION"},
    {6, 6, "MM_CONNECTION_ACTIVE"},
    {7, 7, "MM_IMSI_DETACH_INITIATED"},
    {8, 8, "MM_PROCESS_CM_SERVICE_PROMPT"},
    {9, 9, "MM_WAIT_FOR_NETWORK_COMMAND"},
    {10, 10, "MM_LOCATION_UPDATE_REJECTED"},
    {13, 13, "MM_WAIT_FOR_RR_CONNECTION_LU"},
    {14, 14, "MM_WAIT_FOR_RR_CONNECTION_MM"},
    {15, 15, "MM_WAIT_FOR_RR_CONNECTION_IMSI_DETACH"},
    {17, 17, "MM_REESTABLISHMENT_INITIATED"},
    {18, 18, "MM_WAIT_FOR_RR_ACTIVE"},
    {19, 19, "MM_IDLE"},
    {20, 20, "MM_WAIT_FOR_ADDITIONAL_OUTGOING_MM_ CONNECTION"},
    {21, 21, "MM_WAIT_FOR_RR_CONNECTION_ REESTABLISHMENT"},
    {22, 22, "MM_WAIT_FOR_REESTABLISH_DECISION"},
    {23, 23, "MM_LOCATION_UPDATING_PENDING"},
    {25, 25, "MM_RR_CONNECTION_RELEASE_NOT_ALLOWED"},
};

constexpr ValueName kMmSubStateRows[] = {
    {0, 0, "MM_NULL_SUBSTATE"},        {1, 1, "MM_NO_IMSI"},
    {2, 2, "MM_PLMN_SEARCH"},          {3, 3, "MM_LIMITED_SERVICE"},
    {4, 4, "MM_ATTEMPTING_TO_UPDATE"}, {5, 5, "MM_LOCATION_UPDATE_NEEDED"},
    {6, 6, "MM_NO_CELL_AVAILABLE"},    {7, 7, "MM_PLMN_SEARCH_NORMAL_SERVICE"},
    {8, 8, "MM_NORMAL_SERVICE"},
};

constexpr ValueName kLocationUpdateStatusRows[] = {
    {0, 0, "UPDATED"},
    {1, 1, "NOT_UPDATED"},
    {2, 2, "ROAMING_NOT_ALLOWED"},
    {3, 3, "LOCATION_AREA_NOT_ALLOWED"},
};

constexpr ValueName kGmmStateRows[] = {
    {0, 0, "GMM_NULL"},
    {1, 1, "GMM_DEREGISTERED"},
    {2, 2, "GMM_REGISTERED_INITIATED"},
    {3, 3, "GMM_REGISTERED"},
    {4, 4, "GMM_DEREGISTERED_INITIATED"},
    {5, 5, "GMM_ROUTING_AREA_UPDATE_INITIATED"},
    {6, 6, "GMM_SERVICE_REQUEST_INITIATED"},
};

// Value 9 is spelled without the T of ATTEMPTING, as the baseband names it.
constexpr ValueName kGmmSubStateRows[] = {
    {0, 0, "GMM_NORMAL_SERVICE"},
    {1, 1, "GMM_LIMITED_SERVICE"},
    {2, 2, "GMM_ATTACH_NEEDED"},
    {3, 3, "GMM_ATTEMPTING_TO_ATTACH"},
    {4, 4, "GMM_NO_IMSI"},
    {5, 5, "GMM_NO_CELL_AVAILABLE"},
    {6, 6, "GMM_PLMN_SEARCH"},
    {7, 7, "GMM_SUSPENDED"},
    {8, 8, "GMM_UPDATE_NEEDED"},
    {9, 9, "GMM_ATTEMPING_TO_UPDATE"},
    {10, 10, "GMM_ATTEMPTING_TO_UPDATE_MM"},
    {11, 11, "GMM_IMSI_DETACH_INITIATED"},
    {12, 12, "GMM_NULL_SUBSTATE"},
};

constexpr ValueName kGmmUpdateStatusRows[] = {
    {0, 0, "GMM_GU1_UPDATED"},
    {1, 1, "GMM_GU2_NOT_UPDATED"},
    {2, 2, "GMM_GU3_PLMN_NOT_ALLOWED"},
    {3, 3, "GMM_GU3_ROUTING_AREA_NOT_ALLOWED"},
};

}  // namespace

constexpr ValueNames kRegistrationStateNames{kRegistrationStateRows, "Unknown"};
constexpr ValueNames kMmStateNames{kMmStateRows, "Unknown"};
constexpr ValueNames kMmSubStateNames{kMmSubStateRows, "Unknown"};
constexpr ValueNames kLocationUpdateStatusNames{kLocationUpdateStatusRows, "Unknown"};
constexpr ValueNames kGmmStateNames{kGmmStateRows, "Unknown"};
constexpr ValueNames kGmmSubStateNames{kGmmSubStateRows, "Unknown"};
constexpr ValueNames kGmmUpdateStatusNames{kGmmUpdateStatusRows, "Unknown"};

}  // namespace velmar

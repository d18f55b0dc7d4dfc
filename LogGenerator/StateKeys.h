// StateKeys: the keys of the state dictionary that the model owns and the generators fill.
#pragma once

#include <string_view>

namespace velmar::state_keys {

inline constexpr std::string_view kDisplay = "Display";
inline constexpr std::string_view kDisplayState = "DisplayState";
inline constexpr std::string_view kExtraInfo = "ExtraInfo";
inline constexpr std::string_view kTemplate = "Template";
inline constexpr std::string_view kHistory = "History";
// Keys of one history entry besides the three copied state keys.
inline constexpr std::string_view kDate = "Date";
inline constexpr std::string_view kDescription = "Description";

}  // namespace velmar::state_keys

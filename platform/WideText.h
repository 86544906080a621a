// Conversion for the system's wide-character functions.
#pragma once

#include <string>
#include <string_view>

namespace platform {

// Ill-formed text is replaced.
std::wstring WideFromUTF8(std::string_view text);
std::string UTF8FromWide(std::wstring_view text);

}  // namespace platform

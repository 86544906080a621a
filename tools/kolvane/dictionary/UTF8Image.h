// Images of text in UTF-8, which translators take in UTF-16 with its byte-order mark.
#pragma once

#include <string>
#include <string_view>

// The text, unit for unit, in the machine's byte order and with one mark at its start. Malformed
// bytes become U+FFFD.
std::string MarkedUTF16(std::string_view utf8);

// An image that loads as the text does, with each line where it was. It differs from MarkedUTF16 in
// the first line with text, which the mark must not change. Throws what ToUTF16 throws.
std::string ImageOfUTF8(std::string_view utf8);

// The version text that FileVersionAtLeast compares a file against: "a.b.c.d".
#pragma once
#include <cstdint>
#include <string>

// Parses text into the two 32-bit words of a file version (a<<16|b, c<<16|d). The text needs at
// least three "."; the fourth part runs to the end ("1.2.3.4.5" gives "4.5"). A part is read
// like C atoi: a part that reads as 0 must be decimal digits only (an empty part passes), any
// other part is taken as read ("7b" is 7). False when the text does not parse.
bool ParseVersionText(const std::string& text, std::uint32_t* mostSignificant,
                      std::uint32_t* leastSignificant);

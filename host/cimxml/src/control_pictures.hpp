// The one rule for characters XML 1.0 cannot carry (U+0001 to U+001F other than tab,
// line feed and carriage return; not even as character references): each is sent as
// its Unicode control picture, U+2401 to U+241F, and every such picture the host reads
// from a document is taken as the control character it shows. The same rule on the way
// out and in lets a client send back a key value it received (a port name holding a
// control character still finds its instance), and nothing is dropped silently.
// A control picture that was in the data itself is read back as the control character.
#pragma once

#include <string>
#include <string_view>

namespace orv::cimxml {

// Whether `c` needs the control picture to travel in XML 1.0.
bool needsControlPicture(unsigned char c) noexcept;
// Writes the UTF-8 form of the control picture of `c` (three bytes, E2 90 8x/9x) to `out`;
// returns the end of what it wrote.
char* writeControlPicture(char* out, unsigned char c) noexcept;
// `text` with every control picture of such a character turned back into it.
std::string fromControlPictures(std::string_view text);

}  // namespace orv::cimxml

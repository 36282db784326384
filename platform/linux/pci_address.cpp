#include "pci_address.hpp"

#include <charconv>

namespace orv::linuxhost {

namespace {

// A fixed-width hexadecimal field at the front of text, removed from it.
std::optional<unsigned> takeHex(std::string_view& text, std::size_t width)
{
    if (text.size() < width) return std::nullopt;
    unsigned value = 0;
    auto [end, ec] = std::from_chars(text.data(), text.data() + width, value, 16);
    if (ec != std::errc() || end != text.data() + width) return std::nullopt;
    text.remove_prefix(width);
    return value;
}

bool takeSeparator(std::string_view& text, char separator)
{
    if (text.empty() || text.front() != separator) return false;
    text.remove_prefix(1);
    return true;
}

}  // namespace

std::optional<PciAddress> parsePciAddress(std::string_view text)
{
    auto segment = takeHex(text, 4);
    if (!segment || !takeSeparator(text, ':')) return std::nullopt;
    auto bus = takeHex(text, 2);
    if (!bus || !takeSeparator(text, ':')) return std::nullopt;
    auto slot = takeHex(text, 2);
    if (!slot || !takeSeparator(text, '.')) return std::nullopt;
    auto function = takeHex(text, 1);
    if (!function || !text.empty() || *slot > 0x1f || *function > 7) return std::nullopt;
    return PciAddress{static_cast<std::uint16_t>(*segment), static_cast<std::uint8_t>(*bus),
                      static_cast<std::uint8_t>(*slot), static_cast<std::uint8_t>(*function)};
}

}  // namespace orv::linuxhost

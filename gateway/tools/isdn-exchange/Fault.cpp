#include "Fault.h"

#include <algorithm>
#include <sstream>
#include <stdexcept>

namespace
{
constexpr std::size_t HEADER = 4; // of an I frame (Q.921, 2)
constexpr unsigned char CALL_CONTROL = 0x08;
constexpr unsigned char SINGLE_OCTET = 0x80;
constexpr unsigned char FLAG = 0x80;
constexpr std::size_t REFERENCE = HEADER + 2;

using Octets = std::span<unsigned char const>;

/// Where the message's type is; 0: the frame bears no message with a call reference.
std::size_t TYPE_AT(Octets frame)
{
    bool const isInformation = frame.size() > REFERENCE && (frame[2] & 1) == 0 && frame[HEADER] == CALL_CONTROL;
    std::size_t const at = isInformation ? REFERENCE + frame[HEADER + 1] : 0;
    return at > REFERENCE && at < frame.size() ? at : 0;
}

std::size_t LENGTH_AT(Octets frame, std::size_t at)
{
    bool const isSingle = (frame[at] & SINGLE_OCTET) != 0 || at + 1 >= frame.size();
    return isSingle ? 1 : std::min<std::size_t>(2u + frame[at + 1], frame.size() - at);
}

/// Where the element is, or belongs, since elements come in the order of their identifiers (Q.931, 4.5.1).
std::size_t PLACE_OF(Octets frame, std::size_t at, int element)
{
    while (at < frame.size() && ((frame[at] & SINGLE_OCTET) != 0 || frame[at] < element))
        at += LENGTH_AT(frame, at);
    return at;
}
} // namespace

std::vector<unsigned char> Fault::OCTETS_OF(std::string const& text)
{
    std::istringstream in(text);
    std::vector<unsigned char> octets;
    for (std::string word; in >> word;)
    {
        std::size_t used = 0;
        unsigned long const value = word.size() <= 2 ? std::stoul(word, &used, 16) : 0;
        if (used != word.size())
            throw std::runtime_error("'" + word + "' is no octet");
        octets.push_back(static_cast<unsigned char>(value));
    }
    return octets;
}

bool Fault::READ_REFERENCE(Octets frame, int& reference, bool& isOfOriginator)
{
    std::size_t const type = TYPE_AT(frame);
    if (type == 0)
        return false;
    isOfOriginator = (frame[REFERENCE] & FLAG) == 0;
    reference = frame[REFERENCE] & ~FLAG;
    for (std::size_t i = REFERENCE + 1; i < type; ++i)
        reference = reference << 8 | frame[i];
    return true;
}

std::vector<unsigned char> Fault::apply(Octets frame) const
{
    std::vector<unsigned char> changed(frame.begin(), frame.end());
    std::size_t const type = TYPE_AT(frame);
    if (type == 0 || frame[type] != message)
        return changed;
    if (element == NONE)
    {
        if (!octets.empty())
            changed[type] = octets.front();
        return changed;
    }
    std::size_t const at = PLACE_OF(frame, type + 1, element);
    auto const place = changed.begin() + static_cast<std::ptrdiff_t>(at);
    bool const isThere = at < frame.size() && frame[at] == element;
    auto const rest = isThere ? changed.erase(place, place + static_cast<std::ptrdiff_t>(LENGTH_AT(frame, at))) : place;
    std::vector<unsigned char> wrong{
        static_cast<unsigned char>(element),
        static_cast<unsigned char>(length != NONE ? length : static_cast<int>(octets.size()))};
    wrong.insert(wrong.end(), octets.begin(), octets.end());
    changed.insert(rest, wrong.begin(), wrong.end());
    return changed;
}

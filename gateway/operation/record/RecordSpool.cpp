#include "operation/record/RecordSpool.h"

#include <algorithm>
#include <stdexcept>

namespace
{
constexpr std::size_t PIECE = 65536; // octets
}

RecordSpool::RecordSpool(std::string const& name) : m_file(name)
{
    if (!m_file.lock())
        throw std::runtime_error("another process has " + name);
    std::string piece;
    for (off_t at = 0; !(piece = m_file.read(at, PIECE)).empty(); at += static_cast<off_t>(piece.size()))
        m_number += static_cast<unsigned long long>(std::count(piece.begin(), piece.end(), '\n'));
}

bool RecordSpool::append(std::string_view line)
{
    if (!m_file.append(line))
        return false;
    ++m_number;
    return true;
}

std::vector<std::string> RecordSpool::getFirst(std::size_t most)
{
    std::vector<std::string> lines;
    std::size_t used = 0;
    std::size_t size = PIECE;
    std::string text;
    do // until there is a whole line
        text = m_file.read(m_from, size);
    while (text.find('\n') == std::string::npos && text.size() == size && (size *= 2) != 0);
    for (std::size_t end; lines.size() < most && (end = text.find('\n', used)) != std::string::npos; used = end + 1)
        lines.push_back(text.substr(used, end - used));
    m_next = m_from + static_cast<off_t>(used);
    m_got = lines.size();
    return lines;
}

void RecordSpool::drop()
{
    m_from = m_next;
    m_number -= m_got;
    m_got = 0;
    if (m_number == 0 && m_file.cut(0))
        m_from = m_next = 0;
}

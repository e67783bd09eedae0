#include "testing/Journal.h"

#include "testing/FailingAllocator.h"

#include <algorithm>
#include <utility>

void Journal::add(std::string line)
{
    FailingAllocator::Pause const unseen;
    m_lines.push_back(std::move(line));
}

Lines Journal::take() { return std::exchange(m_lines, {}); }

std::size_t Journal::count(std::string const& line) const
{
    return static_cast<std::size_t>(std::count(m_lines.begin(), m_lines.end(), line));
}

void Journal::name(void const* object, std::string text)
{
    FailingAllocator::Pause const unseen;
    m_names[object] = std::move(text);
}

std::string Journal::nameOf(void const* object, std::string const& otherwise) const
{
    if (object == nullptr)
        return "none";
    auto const found = m_names.find(object);
    return found != m_names.end() ? found->second : otherwise;
}

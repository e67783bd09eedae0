#include "operation/record/RecordDelivery.h"

#include <algorithm>
#include <spdlog/spdlog.h>
#include <stdexcept>
#include <utility>

namespace
{
constexpr std::size_t BATCH = 100; // lines from the spool at once
constexpr std::chrono::milliseconds BETWEEN_TRIES(1000);
} // namespace

RecordDelivery::RecordDelivery(std::string const& name, std::unique_ptr<RecordStore> store, std::string const& folder)
    : m_name(name)
    , m_refusedFile(folder + '/' + name + ".refused")
    , m_store(std::move(store))
    , m_spool(folder + '/' + name + ".spool")
{
    m_spooled = m_spool.getNumber();
}

std::size_t RecordDelivery::take(RecordLines const& lines)
{
    if (m_spool.isEmpty() && isDue() && store(lines))
        return lines.size();
    std::size_t taken = 0;
    while (taken < lines.size() && m_spool.append(lines[taken]))
        ++taken;
    m_spooled = m_spool.getNumber();
    return taken;
}

bool RecordDelivery::deliver()
{
    if (std::exchange(m_isFirst, false))
        store({}); // the log says at once when it is away
    while (!m_spool.isEmpty())
    {
        std::vector<std::string> const lines = m_spool.getFirst(BATCH);
        if (!isDue() || !store({lines.begin(), lines.end()}))
            return false;
        m_spool.drop();
        m_spooled = m_spool.getNumber();
    }
    return true;
}

bool RecordDelivery::store(RecordLines const& lines)
{
    switch (m_store->store(lines))
    {
    case RecordStore::Result::STORED:
        m_written += lines.size();
        noteBack();
        return true;
    case RecordStore::Result::REFUSED:
        return storeEach(lines);
    default:
        noteAway();
        return false;
    }
}

/// One that is refused must not hold up those behind it.
bool RecordDelivery::storeEach(RecordLines const& lines)
{
    if (lines.size() > 1)
        return std::all_of(lines.begin(), lines.end(), [this](std::string_view line) { return store({line}); });
    try
    {
        if (!LineFile(m_refusedFile).append(lines.front()))
            return false;
        spdlog::error("records: {} refuses one, which is in {}: {}", m_name, m_refusedFile, m_store->getReason());
        return true;
    }
    catch (std::runtime_error const&)
    {
        return false;
    }
}

void RecordDelivery::noteAway()
{
    m_next = Clock::now() + BETWEEN_TRIES;
    if (!m_isAway)
        spdlog::error("records: {} takes none, they wait on the disk: {}", m_name, m_store->getReason());
    m_isAway = true;
}

void RecordDelivery::noteBack()
{
    if (m_isAway)
        spdlog::info("records: {} takes them again", m_name);
    m_isAway = false;
}

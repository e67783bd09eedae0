#include "operation/StateDump.h"

#include "operation/ProcessCopy.h"

#include <spdlog/spdlog.h>

#include <sys/wait.h>
#include <unistd.h>
#include <utility>

StateDump::~StateDump()
{
    if (m_child > 0)
        waitpid(m_child, nullptr, 0); // within its patience: what was asked for is told
}

void StateDump::begin(std::function<std::string()> collect)
{
    if (m_child > 0)
    {
        m_next = std::move(collect);
        return;
    }
    m_child = ProcessCopy::START(STDOUT_FILENO, collect);
    if (m_child < 0)
        spdlog::warn("the state cannot be told: no process");
}

void StateDump::onChild()
{
    if (m_child <= 0 || !ProcessCopy::HAS_ENDED(m_child))
        return;
    m_child = 0;
    if (auto const next = std::exchange(m_next, nullptr))
        begin(next);
}

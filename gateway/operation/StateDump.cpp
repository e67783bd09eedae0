#include "operation/StateDump.h"

#include "operation/ProcessCopy.h"

#include <spdlog/spdlog.h>

#include <sys/wait.h>
#include <unistd.h>

StateDump::~StateDump()
{
    if (m_child > 0)
        waitpid(m_child, nullptr, 0); // within its patience: what was asked for is told
}

void StateDump::begin(std::function<std::string()> const& collect)
{
    if (m_child > 0)
    {
        spdlog::info("the state is being told already");
        return;
    }
    m_child = ProcessCopy::START(STDOUT_FILENO, collect);
    if (m_child < 0)
        spdlog::warn("the state cannot be told: no process");
}

void StateDump::onChild()
{
    if (m_child > 0 && ProcessCopy::HAS_ENDED(m_child))
        m_child = 0;
}

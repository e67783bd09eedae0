#include "operation/record/RecordFile.h"

#include <spdlog/spdlog.h>

std::size_t RecordFile::take(RecordLines const& lines)
{
    std::size_t taken = 0;
    while (taken < lines.size() && m_file.append(lines[taken]))
        ++taken;
    m_written += taken;
    return taken;
}

void RecordFile::reopen()
{
    if (!m_file.reopen())
        spdlog::error("{} cannot be opened again: records go on where they were", m_name);
}

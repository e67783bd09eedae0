#include "operation/record/LineFile.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <spdlog/spdlog.h>
#include <stdexcept>
#include <sys/stat.h>
#include <sys/uio.h>
#include <unistd.h>
#include <utility>

namespace
{
constexpr off_t TAIL = 1024 * 1024; // octets

int OPEN_LINES(std::string const& name)
{
    return open(name.c_str(), O_RDWR | O_CREAT | O_APPEND | O_CLOEXEC | O_NOCTTY, 0640);
}
} // namespace

LineFile::LineFile(std::string const& name) : m_name(name), m_descriptor(OPEN_LINES(name))
{
    if (m_descriptor < 0)
        throw std::runtime_error(std::string("cannot be opened: ") + std::strerror(errno));
    cutPiece();
}

LineFile::~LineFile() { close(m_descriptor); }

bool LineFile::append(std::string_view line)
{
    char end = '\n';
    std::array<iovec, 2> const whole{{{const_cast<char*>(line.data()), line.size()}, {&end, 1}}};
    ssize_t written = 0;
    do
        written = writev(m_descriptor, whole.data(), whole.size());
    while (written < 0 && errno == EINTR);
    if (written == static_cast<ssize_t>(line.size() + 1))
        return true;
    if (written > 0 && isRegular() && !cut(getSize() - written))
        spdlog::error("{} ends with a piece of a record", m_name);
    return false;
}

bool LineFile::reopen()
{
    int const descriptor = OPEN_LINES(m_name);
    if (descriptor < 0)
        return false;
    close(std::exchange(m_descriptor, descriptor));
    cutPiece();
    return true;
}

bool LineFile::lock()
{
    struct flock whole = {};
    whole.l_type = F_WRLCK; // of the process: a copy of it does not have it
    whole.l_whence = SEEK_SET;
    return fcntl(m_descriptor, F_SETLK, &whole) == 0;
}

std::string LineFile::read(off_t from, std::size_t most) const
{
    std::string text(most, '\0');
    ssize_t const octets = pread(m_descriptor, text.data(), text.size(), from);
    text.resize(octets > 0 ? static_cast<std::size_t>(octets) : 0);
    return text;
}

off_t LineFile::getSize() const
{
    struct stat status = {};
    fstat(m_descriptor, &status);
    return status.st_size;
}

bool LineFile::cut(off_t size) { return ftruncate(m_descriptor, size) == 0; }

std::string LineFile::getTail() const
{
    if (!isRegular())
        return {};
    off_t const size = getSize();
    off_t const from = std::max<off_t>(size - TAIL, 0);
    return read(from, static_cast<std::size_t>(size - from));
}

bool LineFile::isRegular() const
{
    struct stat status = {};
    return fstat(m_descriptor, &status) == 0 && S_ISREG(status.st_mode);
}

/// A process that was killed, or a machine that fell, may leave one.
void LineFile::cutPiece()
{
    std::string const tail = getTail();
    if (!tail.empty() && tail.back() != '\n')
        cut(getSize() - static_cast<off_t>(tail.size() - (tail.rfind('\n') + 1)));
}

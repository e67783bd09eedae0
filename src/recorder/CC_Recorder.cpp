#include "recorder/CC_Recorder.h"

#include "recorder/CC_RecordWriter.h"

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <limits>
#include <new>
#include <string>
#include <sys/mman.h>
#include <unistd.h>

namespace
{
std::size_t s_mapped = 0;

/// Null when memory is out.
void* MAP(std::size_t octets, int file)
{
    int const flags = file < 0 ? MAP_PRIVATE | MAP_ANONYMOUS : MAP_SHARED;
    void* const image = mmap(nullptr, octets, PROT_READ | PROT_WRITE, flags | MAP_POPULATE, file, 0);
    return image != MAP_FAILED ? image : nullptr;
}

XCode BEGIN(std::size_t octets, int file)
{
    void* const image = MAP(octets, file);
    if (image == nullptr)
        return XCode::NO_ELEMENT;
    s_mapped = octets;
    CC_RecordWriter::INSTANCE().start(image, octets);
    return XCode::OK;
}

/// A file of that size, all of it on the disk: a ring that the disk has no room for would end the process later.
XCode MAKE_FILE(char const* path, std::size_t octets, int& file)
{
    if (octets > static_cast<std::size_t>(std::numeric_limits<off_t>::max()))
        return XCode::NO_ELEMENT;
    file = open(path, O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
    if (file < 0)
        return XCode::FAILURE;
    int const failure = posix_fallocate(file, 0, static_cast<off_t>(octets));
    if (failure == 0)
        return XCode::OK;
    close(file);
    unlink(path);
    return failure == ENOSPC || failure == EFBIG ? XCode::NO_ELEMENT : XCode::FAILURE;
}

/// Whether nothing stands in the way of a file of that name any more.
bool MAKE_WAY(String const& path)
{
    std::string const previous = std::string(path.c_str()) + ".previous";
    return std::rename(path.c_str(), previous.c_str()) == 0 || errno == ENOENT;
}
} // namespace

XCode CC_Recorder::START(std::size_t octets)
{
    return IS_ON() || octets < LEAST_SIZE ? XCode::REFUSED : BEGIN(octets, -1);
}

XCode CC_Recorder::OPEN(String const& path, std::size_t octets)
{
    if (IS_ON() || octets < LEAST_SIZE)
        return XCode::REFUSED;
    try
    {
        if (!MAKE_WAY(path))
            return XCode::FAILURE;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::NO_ELEMENT;
    }
    int file = -1;
    if (XCode const made = MAKE_FILE(path.c_str(), octets, file); !made.isOk())
        return made;
    XCode const result = BEGIN(octets, file);
    close(file); // the mapping keeps it
    return result;
}

void CC_Recorder::CLOSE()
{
    if (IS_ON())
        munmap(CC_RecordWriter::INSTANCE().stop(), s_mapped);
}

bool CC_Recorder::IS_ON() { return CC_RecordWriter::ON() != nullptr; }

std::span<std::byte const> CC_Recorder::GET_IMAGE()
{
    return IS_ON() ? CC_RecordWriter::INSTANCE().getImage() : std::span<std::byte const>();
}

#pragma once

#include <unistd.h>
#include <utility>

/// A descriptor that is closed with its owner.
class IsdnDescriptor
{
public:
    IsdnDescriptor() = default;
    explicit IsdnDescriptor(int descriptor) : m_descriptor(descriptor) {}
    ~IsdnDescriptor() { reset(); }
    IsdnDescriptor(IsdnDescriptor&& other) noexcept : m_descriptor(other.release()) {}
    IsdnDescriptor& operator=(IsdnDescriptor&& other) noexcept
    {
        if (this != &other)
            reset(other.release());
        return *this;
    }

    int get() const { return m_descriptor; } ///< -1: none
    int release() { return std::exchange(m_descriptor, -1); }
    void reset(int descriptor = -1)
    {
        if (m_descriptor >= 0)
            close(m_descriptor);
        m_descriptor = descriptor;
    }

private:
    int m_descriptor = -1;
};

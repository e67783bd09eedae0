// The process's operator new and delete, which let FailingAllocator choose an allocation to fail.
#include "testing/ReplacedNew.h"

#include "platform/base/Export.h"
#include "testing/FailingAllocator.h"

#include <cstdlib>
#include <new>

namespace
{
void* ALLOCATE(std::size_t size) noexcept
{
    return FailingAllocator::isToFail() ? nullptr : std::malloc(size != 0 ? size : 1);
}

void* ALLOCATE(std::size_t size, std::align_val_t alignment) noexcept
{
    auto const unit = static_cast<std::size_t>(alignment);
    return FailingAllocator::isToFail() ? nullptr : std::aligned_alloc(unit, (size + unit - 1) / unit * unit);
}

void* CHECKED(void* memory)
{
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}
} // namespace

void USE_REPLACED_NEW() {}

CC_EXPORT void* operator new(std::size_t size) { return CHECKED(ALLOCATE(size)); }
CC_EXPORT void* operator new[](std::size_t size) { return CHECKED(ALLOCATE(size)); }
CC_EXPORT void* operator new(std::size_t size, std::nothrow_t const&) noexcept { return ALLOCATE(size); }
CC_EXPORT void* operator new[](std::size_t size, std::nothrow_t const&) noexcept { return ALLOCATE(size); }
CC_EXPORT void* operator new(std::size_t size, std::align_val_t alignment)
{
    return CHECKED(ALLOCATE(size, alignment));
}
CC_EXPORT void* operator new[](std::size_t size, std::align_val_t alignment)
{
    return CHECKED(ALLOCATE(size, alignment));
}
CC_EXPORT void* operator new(std::size_t size, std::align_val_t alignment, std::nothrow_t const&) noexcept
{
    return ALLOCATE(size, alignment);
}
CC_EXPORT void* operator new[](std::size_t size, std::align_val_t alignment, std::nothrow_t const&) noexcept
{
    return ALLOCATE(size, alignment);
}

CC_EXPORT void operator delete(void* memory) noexcept { std::free(memory); }
CC_EXPORT void operator delete[](void* memory) noexcept { std::free(memory); }
CC_EXPORT void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
CC_EXPORT void operator delete[](void* memory, std::size_t) noexcept { std::free(memory); }
CC_EXPORT void operator delete(void* memory, std::nothrow_t const&) noexcept { std::free(memory); }
CC_EXPORT void operator delete[](void* memory, std::nothrow_t const&) noexcept { std::free(memory); }
CC_EXPORT void operator delete(void* memory, std::align_val_t) noexcept { std::free(memory); }
CC_EXPORT void operator delete[](void* memory, std::align_val_t) noexcept { std::free(memory); }
CC_EXPORT void operator delete(void* memory, std::size_t, std::align_val_t) noexcept { std::free(memory); }
CC_EXPORT void operator delete[](void* memory, std::size_t, std::align_val_t) noexcept { std::free(memory); }
CC_EXPORT void operator delete(void* memory, std::align_val_t, std::nothrow_t const&) noexcept { std::free(memory); }
CC_EXPORT void operator delete[](void* memory, std::align_val_t, std::nothrow_t const&) noexcept { std::free(memory); }

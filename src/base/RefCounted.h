#pragma once

#include <cstdint>

namespace base
{

/// Base of objects that are owned by a count: who takes a reference gives it back, and the last one deletes.
///
/// A new object has the count 1, its creator's. Single-threaded: the component runs on one thread.
class RefCounted
{
public:
    RefCounted(const RefCounted&) = delete;
    RefCounted& operator=(const RefCounted&) = delete;

    std::uint32_t AddRef() { return ++count; }

    /// The count that remains; at 0 the object is gone.
    std::uint32_t Release()
    {
        const std::uint32_t left = --count;
        if (left == 0)
            delete this;
        return left;
    }

    std::uint32_t GetRefCount() const { return count; }

protected:
    RefCounted() = default;
    virtual ~RefCounted() = default;

private:
    std::uint32_t count = 1;
};

} // namespace base

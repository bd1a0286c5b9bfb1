#ifndef NIB_TESTS_OWNED_H
#define NIB_TESTS_OWNED_H

#include <memory>

/// Ends objects of the renderer factory, on the thread that made them.
struct FactoryRelease
{
    template <typename T>
    void operator()(T* object) const
    {
        object->Release();
    }
};

template <typename T>
using Owned = std::unique_ptr<T, FactoryRelease>;

#endif

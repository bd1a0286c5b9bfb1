#ifndef NIB_TESTS_MODEL_MODEL_ATOMIC_H
#define NIB_TESTS_MODEL_MODEL_ATOMIC_H

// Included first: the library's code that follows in the same file gets atomics of the model. What
// the standard library needs real ones for is included before.

#include "Explorer.h"
#include "Memory.h"

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstring>
#include <functional>
#include <list>
#include <map>
#include <memory>
#include <mutex>
#include <new>
#include <optional>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

namespace Model
{

/// Looks like std::atomic. One that is made outside of an execution is a plain value.
template <typename T>
class Atomic
{
public:
    static constexpr bool is_always_lock_free = true;

    Atomic() : Atomic(T{}) {}
    Atomic(T value) : m_plain(value), m_atomic(IsExploring() ? NewAtomic(Bits(value)) : -1) {}
    ~Atomic()
    {
        if (IsModelled())
            EndAtomic(m_atomic);
    }
    Atomic(const Atomic&) = delete;
    Atomic& operator=(const Atomic&) = delete;

    T load(std::memory_order order) const
    {
        return IsModelled() ? Value(Model::Load(m_atomic, order)) : m_plain;
    }

    void store(T value, std::memory_order order)
    {
        if (IsModelled())
            Model::Store(m_atomic, Bits(value), order);
        else
            m_plain = value;
    }

    T exchange(T value, std::memory_order order)
    {
        return Change(order, [value](T) { return value; });
    }
    T fetch_add(T summand, std::memory_order order)
    {
        return Change(order, [summand](T old) { return static_cast<T>(old + summand); });
    }
    T fetch_sub(T summand, std::memory_order order)
    {
        return Change(order, [summand](T old) { return static_cast<T>(old - summand); });
    }

private:
    bool IsModelled() const { return m_atomic >= 0 && IsExploring(); }

    static std::uint64_t Bits(T value)
    {
        std::uint64_t bits = 0;
        std::memcpy(&bits, &value, sizeof value);
        return bits;
    }
    static T Value(std::uint64_t bits)
    {
        T value;
        std::memcpy(&value, &bits, sizeof value);
        return value;
    }

    template <typename Function>
    T Change(std::memory_order order, Function function)
    {
        if (!IsModelled())
            return std::exchange(m_plain, function(m_plain));
        const T old = Value(BeginChange(m_atomic, order));
        EndChange(m_atomic, Bits(function(old)), order);
        return old;
    }

    T m_plain;
    int m_atomic;
};

} // namespace Model

namespace std
{
template <typename T>
using NibModelAtomic = Model::Atomic<T>;
}

#define atomic NibModelAtomic

#endif

#include "Memory.h"

#include "Explorer.h"

#include <algorithm>

namespace Model
{

Weakening g_weakening;

namespace
{

struct Value
{
    std::uint64_t bits;
    View view;
};

struct Atomic
{
    std::vector<Value> values; ///< the first is the initial one, with index 1
    int sequential = 0;        ///< the newest that a sequentially consistent access has seen
    bool ended = false;
};

std::vector<Atomic> g_atomics;
std::vector<View> g_views; ///< of each thread

/// What a step on that atomic touches; no object has such an address.
const void* NameOf(int atomic)
{
    return reinterpret_cast<const void*>(static_cast<std::uintptr_t>(atomic) * 2 + 1);
}

int NewestOf(const Atomic& atomic)
{
    return static_cast<int>(atomic.values.size());
}

void Grow(std::vector<int>& numbers, int index)
{
    if (static_cast<int>(numbers.size()) <= index)
        numbers.resize(static_cast<std::size_t>(index) + 1);
}

bool Acquires(std::memory_order order)
{
    return order == std::memory_order_acquire || order == std::memory_order_acq_rel ||
           order == std::memory_order_seq_cst || order == std::memory_order_consume;
}

bool Releases(std::memory_order order)
{
    return order == std::memory_order_release || order == std::memory_order_acq_rel ||
           order == std::memory_order_seq_cst;
}

Atomic& Access(int index)
{
    Atomic& atomic = g_atomics[static_cast<std::size_t>(index)];
    Require(!atomic.ended, "an atomic is used after its end");
    Require(MyView().Value(index) > 0, "an atomic is used by a thread that has not seen it made");
    return atomic;
}

void CountStep()
{
    View& view = MyView();
    Grow(view.steps, Self());
    ++view.steps[static_cast<std::size_t>(Self())];
}

} // namespace

void View::Join(const View& other)
{
    for (std::size_t index = 0; index < other.values.size(); ++index)
        See(static_cast<int>(index), other.values[index]);
    for (std::size_t index = 0; index < other.steps.size(); ++index)
    {
        Grow(steps, static_cast<int>(index));
        steps[index] = std::max(steps[index], other.steps[index]);
    }
}

int View::Value(int atomic) const
{
    const auto index = static_cast<std::size_t>(atomic);
    return index < values.size() ? values[index] : 0;
}

void View::See(int atomic, int value)
{
    Grow(values, atomic);
    int& seen = values[static_cast<std::size_t>(atomic)];
    seen = std::max(seen, value);
}

int View::Steps(int thread) const
{
    const auto index = static_cast<std::size_t>(thread);
    return index < steps.size() ? steps[index] : 0;
}

void ForgetMemory()
{
    g_atomics.clear();
    g_views.assign(1, View{});
}

void InheritView(int thread)
{
    CountStep();
    g_views.resize(std::max(g_views.size(), static_cast<std::size_t>(thread) + 1));
    g_views[static_cast<std::size_t>(thread)] = MyView();
}

void SeeAllOf(int thread)
{
    MyView().Join(g_views[static_cast<std::size_t>(thread)]);
}

View& MyView()
{
    return g_views[static_cast<std::size_t>(Self())];
}

void HandOn(View& view)
{
    CountStep();
    view.Join(MyView());
}

void TakeOver(const View& view)
{
    MyView().Join(view);
}

int NewAtomic(std::uint64_t value)
{
    const int index = static_cast<int>(g_atomics.size());
    MyView().See(index, 1);
    g_atomics.push_back({{{value, View{}}}});
    return index;
}

void EndAtomic(int atomic)
{
    g_atomics[static_cast<std::size_t>(atomic)].ended = true;
}

std::uint64_t Load(int index, std::memory_order order)
{
    if (order == std::memory_order_seq_cst && g_weakening.loadSequential)
        order = std::memory_order_acquire;
    if (g_weakening.loadAcquire && order == std::memory_order_acquire)
        order = std::memory_order_relaxed;
    Before({NameOf(index), false});
    Atomic& atomic = Access(index);
    View& view = MyView();
    const bool isSequential = order == std::memory_order_seq_cst;
    const int newest = NewestOf(atomic);
    const int oldest = std::max({view.Value(index), isSequential ? atomic.sequential : 0, 1});
    const int read = IsSpinning() ? newest : newest - Choose(newest - oldest + 1);
    view.See(index, read);
    if (isSequential)
        atomic.sequential = std::max(atomic.sequential, read);
    const Value& value = atomic.values[static_cast<std::size_t>(read) - 1];
    if (Acquires(order))
        view.Join(value.view);
    return value.bits;
}

void Store(int index, std::uint64_t bits, std::memory_order order)
{
    if (g_weakening.storeRelease && order == std::memory_order_release)
        order = std::memory_order_relaxed;
    Before({NameOf(index), true});
    Atomic& atomic = Access(index);
    CountStep();
    View& view = MyView();
    view.See(index, NewestOf(atomic) + 1);
    atomic.values.push_back({bits, Releases(order) ? view : View{}});
    if (order == std::memory_order_seq_cst)
        atomic.sequential = NewestOf(atomic);
}

std::uint64_t BeginChange(int index, std::memory_order order)
{
    Before({NameOf(index), true});
    Atomic& atomic = Access(index);
    const Value& value = atomic.values.back();
    MyView().See(index, NewestOf(atomic));
    if (Acquires(order) && !(g_weakening.exchangeAcquire && order == std::memory_order_acq_rel))
        MyView().Join(value.view);
    return value.bits;
}

void EndChange(int index, std::uint64_t bits, std::memory_order order)
{
    Atomic& atomic = g_atomics[static_cast<std::size_t>(index)];
    CountStep();
    View& view = MyView();
    view.See(index, NewestOf(atomic) + 1);
    // What the changed value was published with goes on being published.
    Value value{bits, atomic.values.back().view};
    if (Releases(order) && !(g_weakening.exchangeRelease && order == std::memory_order_acq_rel))
        value.view.Join(view);
    atomic.values.push_back(std::move(value));
    if (order == std::memory_order_seq_cst && !g_weakening.addSequential)
        atomic.sequential = NewestOf(atomic);
}

bool Plain::IsBefore(const Access& access)
{
    return access.thread == Self() || MyView().Steps(access.thread) >= access.step;
}

void Plain::Write()
{
    Before({this, true});
    CountStep();
    Require(std::all_of(m_reads.begin(), m_reads.end(), &IsBefore) &&
                std::all_of(m_writes.begin(), m_writes.end(), &IsBefore),
            "a plain variable is written without order");
    m_reads.clear();
    m_writes.assign(1, {Self(), MyView().Steps(Self())});
}

void Plain::Read()
{
    Before({this, false});
    CountStep();
    Require(std::all_of(m_writes.begin(), m_writes.end(), &IsBefore),
            "a plain variable is read without order");
    m_reads.push_back({Self(), MyView().Steps(Self())});
}

} // namespace Model

#include "Explorer.h"

#include "Memory.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include <ucontext.h>

namespace Model
{

namespace
{

constexpr std::size_t kStackSize = 128 * 1024;
constexpr int kLooksUntilNewest = 8; // loads in a row, while nobody writes
constexpr int kLooksUntilHeld = 24;

using Mask = std::uint32_t;

Mask Bit(int index)
{
    return Mask{1} << index;
}

int Lowest(Mask mask)
{
    return __builtin_ctz(mask);
}

struct Fiber
{
    ucontext_t context{};
    std::unique_ptr<char[]> stack{new char[kStackSize]};
    std::function<void()> body;
    Step next{nullptr, false};
    std::function<bool()> enabled;
    bool ended = false;
    int looks = 0; ///< since anybody wrote
    long writesWhenLooked = 0;
    long writesWhenHeld = -1; ///< held until there are more; -1: not held
};

/// A choice that an execution made; the next execution makes another one at the last of them.
struct Decision
{
    bool ofThread;
    int chosen;
    int options;    ///< of a value
    Mask enabled;   ///< of a thread
    Mask asleep;    ///< need not run here: a sibling order covers it
    Mask tried = 0; ///< threads whose turn has been explored here
};

class Explorer
{
public:
    Result Run(const std::function<void()>& scenario)
    {
        Result result;
        do
        {
            RunOnce(scenario);
            result.executions += !m_redundant;
            result.failure = m_failure;
        } while (m_failure.empty() && Backtrack());
        return result;
    }

    int Spawn(std::function<void()> body)
    {
        const int index = static_cast<int>(m_fibers.size());
        m_fibers.push_back(std::make_unique<Fiber>());
        Fiber& fiber = *m_fibers.back();
        fiber.body = std::move(body);
        getcontext(&fiber.context);
        fiber.context.uc_stack.ss_sp = fiber.stack.get();
        fiber.context.uc_stack.ss_size = kStackSize;
        fiber.context.uc_link = &m_main;
        makecontext(&fiber.context, &Explorer::RunFiber, 0);
        return index;
    }

    void Before(Step step, std::function<bool()> enabled)
    {
        Fiber& fiber = *m_fibers[static_cast<std::size_t>(m_current)];
        fiber.next = step;
        fiber.enabled = std::move(enabled);
        NoteLook(fiber, step);
        swapcontext(&fiber.context, &m_main);
        if (step.writes)
            ++m_writes;
    }

    int Choose(int options)
    {
        if (options == 1 || m_redundant)
            return 0;
        if (m_position == m_decisions.size())
            m_decisions.push_back({false, 0, options, 0, 0});
        return m_decisions[m_position++].chosen;
    }

    void Require(bool holds, const char* what)
    {
        if (!holds && m_failure.empty() && !m_redundant)
            m_failure = what;
    }

    bool IsSpinning() const
    {
        return m_redundant ||
               m_fibers[static_cast<std::size_t>(m_current)]->looks > kLooksUntilNewest;
    }
    bool HasEnded(int thread) const { return m_fibers[static_cast<std::size_t>(thread)]->ended; }
    int Self() const { return m_current; }
    long Execution() const { return m_execution; }

private:
    static void RunFiber();

    void RunOnce(const std::function<void()>& scenario)
    {
        ForgetMemory();
        ++m_execution;
        m_fibers.clear();
        m_position = 0;
        m_writes = 0;
        m_asleep = 0;
        m_redundant = false;
        Spawn(scenario);
        while (StepOne())
        {
        }
    }

    /// False when no thread can go on.
    bool StepOne()
    {
        const Mask enabled = Enabled();
        if (enabled == 0)
        {
            for (const auto& fiber : m_fibers)
                Require(fiber->ended, "threads wait for ever");
            return false;
        }
        m_current = ChooseThread(enabled);
        Fiber& fiber = *m_fibers[static_cast<std::size_t>(m_current)];
        fiber.writesWhenHeld = -1;
        swapcontext(&m_main, &fiber.context);
        return true;
    }

    Mask Enabled() const
    {
        Mask enabled = 0;
        for (std::size_t index = 0; index < m_fibers.size(); ++index)
        {
            const Fiber& fiber = *m_fibers[index];
            const bool held = fiber.writesWhenHeld == m_writes;
            if (!fiber.ended && !held && (!fiber.enabled || fiber.enabled()))
                enabled |= Bit(static_cast<int>(index));
        }
        return enabled;
    }

    int ChooseThread(Mask enabled)
    {
        for (Mask rest = enabled; rest != 0; rest &= rest - 1)
        {
            if (m_fibers[static_cast<std::size_t>(Lowest(rest))]->next.object == nullptr)
                return Lowest(rest); // nobody sees when it does that
        }
        if (m_redundant)
            return Lowest(enabled);
        Mask tried = 0;
        int chosen = 0;
        if ((enabled & (enabled - 1)) == 0) // no choice
        {
            chosen = Lowest(enabled);
            if (m_asleep & enabled)
                m_redundant = true;
        }
        else
        {
            if (m_position == m_decisions.size())
            {
                if ((enabled & ~m_asleep) == 0)
                {
                    m_redundant = true;
                    return Lowest(enabled);
                }
                m_decisions.push_back({true, Lowest(enabled & ~m_asleep), 0, enabled, m_asleep});
            }
            const Decision& decision = m_decisions[m_position++];
            chosen = decision.chosen;
            tried = decision.tried;
        }
        FallAsleep(tried, chosen);
        return chosen;
    }

    /// After the step of @p chosen, those threads need not come first whose steps change places with
    /// it: the order in which they come first has been seen.
    void FallAsleep(Mask tried, int chosen)
    {
        const Step& step = m_fibers[static_cast<std::size_t>(chosen)]->next;
        Mask asleep = 0;
        for (Mask rest = (m_asleep | tried) & ~Bit(chosen); rest != 0; rest &= rest - 1)
        {
            const int index = Lowest(rest);
            const Fiber& fiber = *m_fibers[static_cast<std::size_t>(index)];
            const bool waitsForWrites = fiber.writesWhenHeld >= 0 && step.writes;
            const bool conflict =
                fiber.next.object == step.object && (fiber.next.writes || step.writes);
            if (!conflict && !waitsForWrites)
                asleep |= Bit(index);
        }
        m_asleep = asleep;
    }

    /// The next execution differs in the last decision that has something left to try.
    bool Backtrack()
    {
        for (; !m_decisions.empty(); m_decisions.pop_back())
        {
            Decision& last = m_decisions.back();
            if (!last.ofThread)
            {
                if (++last.chosen < last.options)
                    return true;
                continue;
            }
            last.tried |= Bit(last.chosen);
            const Mask left = last.enabled & ~(last.asleep | last.tried);
            if (left == 0)
                continue;
            last.chosen = Lowest(left);
            return true;
        }
        return false;
    }

    void NoteLook(Fiber& fiber, Step step)
    {
        if (step.object == nullptr)
            return;
        const bool sameAsBefore = !step.writes && fiber.writesWhenLooked == m_writes;
        fiber.looks = sameAsBefore ? fiber.looks + 1 : 0;
        fiber.writesWhenLooked = m_writes;
        if (fiber.looks >= kLooksUntilHeld)
            fiber.writesWhenHeld = m_writes;
    }

    std::vector<std::unique_ptr<Fiber>> m_fibers;
    std::vector<Decision> m_decisions;
    std::size_t m_position = 0;
    ucontext_t m_main{};
    int m_current = 0;
    long m_writes = 0;
    long m_execution = 0;
    Mask m_asleep = 0;
    bool m_redundant = false; ///< only finishes an execution whose order has been seen
    std::string m_failure;
};

Explorer* g_explorer = nullptr;

void Explorer::RunFiber()
{
    Explorer& explorer = *g_explorer;
    Fiber& fiber = *explorer.m_fibers[static_cast<std::size_t>(explorer.m_current)];
    fiber.body();
    fiber.body = {};
    Model::Before({&fiber, true});
    fiber.ended = true;
}

} // namespace

Result Explore(const std::function<void()>& scenario)
{
    Explorer explorer;
    g_explorer = &explorer;
    Result result = explorer.Run(scenario);
    g_explorer = nullptr;
    return result;
}

bool IsExploring()
{
    return g_explorer != nullptr;
}

int Spawn(std::function<void()> body)
{
    const int thread = g_explorer->Spawn(std::move(body));
    InheritView(thread);
    return thread;
}

void Join(int thread)
{
    Before({nullptr, false}, [thread] { return g_explorer->HasEnded(thread); });
    SeeAllOf(thread);
}

long Execution()
{
    return g_explorer->Execution();
}

int Self()
{
    return g_explorer->Self();
}

void Require(bool holds, const char* what)
{
    g_explorer->Require(holds, what);
}

void Before(Step step, std::function<bool()> enabled)
{
    g_explorer->Before(step, std::move(enabled));
}

int Choose(int options)
{
    return g_explorer->Choose(options);
}

bool IsSpinning()
{
    return g_explorer->IsSpinning();
}

} // namespace Model

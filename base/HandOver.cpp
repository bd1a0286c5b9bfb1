#include "base/HandOver.h"

#include <utility>

namespace Nib
{

namespace
{

constinit thread_local HandOver* t_current = nullptr;

} // namespace

HandOver::HandOver() noexcept
{
    if (t_current == nullptr)
        t_current = this;
}

HandOver::~HandOver()
{
    if (t_current != this)
        return;
    t_current = nullptr;
    EndNow();
}

void HandOver::SpinInWait() noexcept
{
    m_spins = true;
}

HandOver* HandOver::OfThisThread() noexcept
{
    return t_current;
}

void HandOver::EndLater(WaitWord* word) noexcept
{
    EndNow(); // one at a time
    m_owed = word;
}

void HandOver::EndNow() noexcept
{
    WaitWord* const word = std::exchange(m_owed, nullptr);
    if (word != nullptr && word->End())
        word->WakeSleeper();
}

void HandOver::AfterSectionIsLeft() noexcept
{
    if (m_left != nullptr)
        m_left->store(true, std::memory_order_relaxed);
    EndNow();
}

void HandOver::Spin(const WaitWord& word) noexcept
{
    if (m_spins && !word.SpinUntilEnded())
        m_hasSpunInVain = true;
}

} // namespace Nib

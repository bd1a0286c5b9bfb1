#include "base/ThreadAnnotations.h"

#include <nib/base.h>

#include <type_traits>

namespace Nib
{

// A mutex made by an initialiser holds no resource. Without a destructor a static one can be used
// until the very end of the process.
static_assert(std::is_trivially_destructible_v<CriticalSection>);

void CriticalSection::Enter() noexcept NIB_NO_THREAD_SAFETY_ANALYSIS
{
    pthread_mutex_lock(&m_mutex);
}

void CriticalSection::Leave() noexcept NIB_NO_THREAD_SAFETY_ANALYSIS
{
    pthread_mutex_unlock(&m_mutex);
}

} // namespace Nib

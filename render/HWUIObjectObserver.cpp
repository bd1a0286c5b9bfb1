#include "render/HWUIObjectObserver.h"

#include "base/Log.h"

namespace Nib::GLES
{

CriticalSection HWUIObjectObserver::m_instanceGuard;
HWUIObjectObserver* HWUIObjectObserver::m_instance = nullptr;

HWUIObjectObserver* HWUIObjectObserver::GetInstance()
{
    NIB_FUNCTION("static Nib::GLES::HWUIObjectObserver *"
                 "Nib::GLES::HWUIObjectObserver::GetInstance()");
    AutoCriticalSection guard(m_instanceGuard);
    if (m_instance == nullptr)
    {
        NIB_LOG_INFO("%s - Create new instance", function);
        m_instance = new HWUIObjectObserver;
    }
    ++m_instance->m_references;
    return m_instance;
}

bool HWUIObjectObserver::Release()
{
    NIB_FUNCTION("bool Nib::GLES::HWUIObjectObserver::Release()");
    AutoCriticalSection guard(m_instanceGuard);
    if (--m_references > 0)
        return false;
    NIB_LOG_INFO("%s - Destroy HWUIObjectObserver", function);
    m_instance = nullptr;
    delete this;
    return true;
}

} // namespace Nib::GLES

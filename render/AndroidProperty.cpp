#include <nib/partial_update.h>

#include "base/Log.h"

#include <atomic>

#include <dlfcn.h>

namespace Nib
{

namespace
{

using PropertyGet = int (*)(const char* name, char* value);

// Threads that come first at once store the same address; a failure is tried again.
std::atomic<PropertyGet> g_propertyGet{nullptr};

// dlerror() has nothing to say a second time.
const char* LoaderError()
{
    const char* error = dlerror();
    return error != nullptr ? error : "(null)";
}

PropertyGet Resolve(const char* function)
{
    void* library = dlopen("libc.so", RTLD_LAZY);
    if (library == nullptr)
    {
        NIB_LOG_ERROR("%s - Cannot dlopen libc.so: %s.\n", function, LoaderError());
        return nullptr;
    }
    const auto found = reinterpret_cast<PropertyGet>(dlsym(library, "__system_property_get"));
    g_propertyGet.store(found, std::memory_order_relaxed);
    dlclose(library);
    return found;
}

} // namespace

int android_property_get(const char* name, char* value)
{
    NIB_FUNCTION("int Nib::android_property_get(const char *, char *)");
    PropertyGet get = g_propertyGet.load(std::memory_order_relaxed);
    if (get == nullptr)
        get = Resolve(function);
    if (get == nullptr)
    {
        NIB_LOG_ERROR("%s - Cannot resolve __system_property_get(): %s.\n", function,
                      LoaderError());
        value[0] = '\0';
        return 0;
    }
    return get(name, value);
}

} // namespace Nib

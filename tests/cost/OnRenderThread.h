#ifndef NIB_TESTS_COST_ON_RENDER_THREAD_H
#define NIB_TESTS_COST_ON_RENDER_THREAD_H

#include "HotPaths.h"

#include <nib/base.h>
#include <nib/msg_queue.h>
#include <nib/render_thread.h>
#include <nib/task.h>

#include <cstdlib>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <utility>

/// Runs @p action with a scene on a render thread of the driver that does nothing, with a cache
/// folder that goes with it and without log output.
inline void OnRenderThread(std::function<void(HotScene&)> action)
{
    class Task : public Nib::ITask
    {
    public:
        explicit Task(std::function<void(HotScene&)> todo) : m_todo(std::move(todo)) {}
        void run() override
        {
            HotScene scene;
            m_todo(scene);
        }

    private:
        std::function<void(HotScene&)> m_todo;
    };

    std::string folder = (std::filesystem::temp_directory_path() / "nib-cost-XXXXXX").string();
    if (!mkdtemp(folder.data()))
        std::abort();
    Nib::System::SetSDKCacheDirectoryPath((folder + "/sdk").c_str());
    setenv("NIB_LOG", "silent", 1);
    {
        const std::unique_ptr<Nib::RenderThreadGL> thread(
            Nib::GLES::CreateSurfaceRenderer("cost", Nib::RenderThreadGL::Medium));
        thread->Start();
        thread->GetMsgQueue()->enQueueMsg(new Task(std::move(action)));
        thread->GetMsgQueue()->waitForCompleting();
    }
    std::filesystem::remove_all(folder);
}

#endif

#ifndef NIB_TESTS_DEBUG_CHECKERFIXTURE_H
#define NIB_TESTS_DEBUG_CHECKERFIXTURE_H

#include "sim/SimDriver.h"

#include <nib/base.h>
#include <nib/msg_queue.h>
#include <nib/resource_checker.h>

#include <gtest/gtest.h>

#include <cstdio>
#include <stdexcept>
#include <string>
#include <vector>

using Nib::ResourceChecker;
using Descriptor = ResourceChecker::dbDescriptor;
using Item = ResourceChecker::CheckerItem;
using Texts = std::vector<std::string>;

/// A queue that is only somebody's address and name.
class TestQueue : public Nib::IGLMsgQueue
{
public:
    explicit TestQueue(const char* tag) : m_tag(tag) {}
    bool enQueueMsg(Nib::ITask*) override { return false; }
    bool waitForCompleting() override { return true; }
    bool isRunning() override { return true; }
    const char* getTag() override { return m_tag; }

private:
    const char* m_tag;
};

/// An engineering build, with a context and a queue for the calling thread.
class ResourceCheckerTest : public testing::Test
{
protected:
    ResourceCheckerTest() : context(driver)
    {
        Nib::System::SetBuildTypeEngMode(true);
        Nib::AttachToThread(&queue);
        driver.ForgetLog();
    }

    ~ResourceCheckerTest() override
    {
        Nib::AttachToThread(nullptr);
        for (ResourceChecker::Database* db :
             {&ResourceChecker::textureDb, &ResourceChecker::samplerDb,
              &ResourceChecker::frameBufferDb, &ResourceChecker::renderBufferDb,
              &ResourceChecker::vertexBufferDb})
            db->clear();
        ResourceChecker::contextDb.clear();
    }

    /// "Context: 0x1, Queue: 0x2[queue], Id 7" as the lookups write it.
    std::string Who(void* owner, Nib::IGLMsgQueue* q, const char* name, unsigned id) const
    {
        char text[256];
        std::snprintf(text, sizeof(text), "Context: %p, Queue: %p[%s], Id %u", owner,
                      static_cast<void*>(q), name, id);
        return text;
    }

    /// The message of the std::logic_error that @p action throws, "" when it throws none.
    template <typename Action>
    static std::string Thrown(Action action)
    {
        try
        {
            action();
        }
        catch (const std::logic_error& error)
        {
            return error.what();
        }
        return "";
    }

    SimDriver driver;
    SimContext context;
    TestQueue queue{"queue"};
};

inline const Descriptor& Texture = ResourceChecker::textureDbDescriptor;
inline const Descriptor& FrameBuffer = ResourceChecker::frameBufferDbDescriptor;

struct Kind
{
    const Descriptor& db;
    const char* name;
};

inline const Kind kKinds[] = {
    {ResourceChecker::textureDbDescriptor, "textureDb"},
    {ResourceChecker::samplerDbDescriptor, "samplerDb"},
    {ResourceChecker::frameBufferDbDescriptor, "frameBufferDb"},
    {ResourceChecker::renderBufferDbDescriptor, "renderBufferDb"},
    {ResourceChecker::vertexBufferDbDescriptor, "vertexBufferDb"},
};

#endif

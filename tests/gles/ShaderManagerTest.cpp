#include "gles/BoundQueue.h"
#include "gles/GlContext.h"

#include <nib/shader_manager.h>
#include <nib/task.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <thread>
#include <type_traits>

using namespace Nib;

namespace
{

ShaderManager::Entry EntryOf(int* program, uint32_t useCount)
{
    ShaderManager::Entry entry;
    entry.program = program;
    entry.useCount = useCount;
    return entry;
}

/// A render thread's place: a queue, and a context that is current.
class ShaderManagerTest : public testing::Test
{
protected:
    ShaderManagerTest() : manager(ShaderManager::GetInstance()) { gl.Forget(); }
    ~ShaderManagerTest() override { EXPECT_EQ(manager->Size(), 0u) << "the test left an entry"; }

    /// Registers under the context that is current.
    void Register(const char* name) { manager->Add(name, EntryOf(&program, 1)); }

    bool IsRegistered(const char* name) { return manager->Find(name, nullptr); }

    Texts Infos() const { return gl.Log(ANDROID_LOG_INFO); }
    Texts Errors() const { return gl.Log(ANDROID_LOG_ERROR); }

    GlContext gl;
    BoundQueue queue;
    ShaderManager* const manager;
    int program = 0;
};

} // namespace

// ---- keys and entries ---------------------------------------------------------------------------

TEST_F(ShaderManagerTest, AKeyCopiesItsName)
{
    char name[] = "brush";
    const ShaderManager::Key key(name);
    name[0] = 'c';
    EXPECT_EQ(key.name, "brush");
}

TEST_F(ShaderManagerTest, AKeyTakesTheCurrentContext)
{
    EXPECT_EQ(ShaderManager::Key("a").context, gl.context.Handle());
    gl.context.Release();
    EXPECT_EQ(ShaderManager::Key("a").context, nullptr);
    gl.context.MakeCurrent();
}

TEST_F(ShaderManagerTest, AKeyWithoutATextHasAnEmptyName)
{
    EXPECT_EQ(ShaderManager::Key(nullptr).name, "");
}

TEST_F(ShaderManagerTest, KeysAreOrderedByNameFirst)
{
    ShaderManager::Key a("a");
    ShaderManager::Key b("b");
    a.context = reinterpret_cast<void*>(2);
    b.context = reinterpret_cast<void*>(1);
    EXPECT_TRUE(a < b);
    EXPECT_FALSE(b < a);
    // Bytes count as unsigned, as strcmp() has them, and a name goes before what it begins.
    EXPECT_TRUE(ShaderManager::Key("z") < ShaderManager::Key("\xC3"));
    EXPECT_TRUE(ShaderManager::Key("a") < ShaderManager::Key("aa"));
    EXPECT_TRUE(ShaderManager::Key("B") < ShaderManager::Key("a"));
}

TEST_F(ShaderManagerTest, KeysOfOneNameAreOrderedByTheAddressOfTheContext)
{
    ShaderManager::Key low("a");
    ShaderManager::Key high("a");
    low.context = reinterpret_cast<void*>(0x7FFFFFFFFFFFFFFF);
    high.context = reinterpret_cast<void*>(0x8000000000000000);
    EXPECT_TRUE(low < high);
    EXPECT_FALSE(high < low);
    EXPECT_FALSE(low < ShaderManager::Key(low));
}

TEST_F(ShaderManagerTest, ANewEntryIsZero)
{
    const ShaderManager::Entry entry;
    EXPECT_EQ(entry.program, nullptr);
    EXPECT_EQ(entry.useCount, 0u);
}

// ---- registration -------------------------------------------------------------------------------

TEST_F(ShaderManagerTest, ThereIsOneManager)
{
    EXPECT_EQ(ShaderManager::GetInstance(), manager);
    static_assert(!std::is_copy_constructible_v<ShaderManager>);
}

TEST_F(ShaderManagerTest, FindsWhatWasAdded)
{
    manager->Add("brush", EntryOf(&program, 7));

    ShaderManager::Entry found;
    EXPECT_TRUE(manager->Find("brush", &found));
    EXPECT_EQ(found.program, &program);
    EXPECT_EQ(found.useCount, 7u);
    EXPECT_TRUE(manager->Find("brush", nullptr));
    EXPECT_EQ(manager->Size(), 1u);

    EXPECT_TRUE(manager->Remove("brush"));
}

TEST_F(ShaderManagerTest, LeavesTheResultAloneWhenThereIsNothingToFind)
{
    ShaderManager::Entry found = EntryOf(&program, 7);
    EXPECT_FALSE(manager->Find("brush", &found));
    EXPECT_EQ(found.program, &program);
    EXPECT_EQ(found.useCount, 7u);
}

TEST_F(ShaderManagerTest, AddingAgainReplaces)
{
    int other = 0;
    manager->Add("brush", EntryOf(&program, 1));
    manager->Add("brush", EntryOf(&other, 2));

    ShaderManager::Entry found;
    EXPECT_TRUE(manager->Find("brush", &found));
    EXPECT_EQ(found.program, &other);
    EXPECT_EQ(found.useCount, 2u);
    EXPECT_EQ(manager->Size(), 1u);

    EXPECT_TRUE(manager->Remove("brush"));
}

TEST_F(ShaderManagerTest, RemovesOnce)
{
    Register("brush");
    EXPECT_TRUE(manager->Remove("brush"));
    EXPECT_FALSE(manager->Remove("brush"));
    EXPECT_FALSE(IsRegistered("brush"));
}

TEST_F(ShaderManagerTest, ANameStandsForOneProgramInEachContext)
{
    Register("brush");
    const ShaderManager::Key first("brush");
    const SimContext other(gl.driver);
    EXPECT_FALSE(IsRegistered("brush"));
    Register("brush");
    EXPECT_EQ(manager->Size(), 2u);
    EXPECT_TRUE(manager->Remove("brush"));
    EXPECT_TRUE(manager->Find(first, nullptr));
    EXPECT_TRUE(manager->Remove(first));
}

// ---- context loss -------------------------------------------------------------------------------

TEST_F(ShaderManagerTest, ADestroyedContextIsOneLine)
{
    manager->OnDestroyContext();
    EXPECT_EQ(Infos(), (Texts{"void Nib::ShaderManager::OnDestroyContext()"}));
    EXPECT_EQ(gl.driver.Log().size(), 1u);
}

TEST_F(ShaderManagerTest, WithoutADestroyedContextARestoreIsOneLine)
{
    Register("brush");
    manager->OnRestoreContext();
    EXPECT_EQ(Infos(), (Texts{"void Nib::ShaderManager::OnRestoreContext()"}));
    EXPECT_EQ(gl.driver.Log().size(), 1u);
    EXPECT_TRUE(manager->Remove("brush"));
}

TEST_F(ShaderManagerTest, WithoutADestroyedContextShadersOfNoContextStay)
{
    gl.context.Release();
    Register("early");
    gl.context.MakeCurrent();

    manager->OnRestoreContext();

    EXPECT_FALSE(IsRegistered("early")); // here; it still belongs to no context
    gl.context.Release();
    EXPECT_TRUE(manager->Remove("early"));
    gl.context.MakeCurrent();
}

TEST_F(ShaderManagerTest, ShadersOfADeadContextMoveToTheNewOne)
{
    manager->Add("pen", EntryOf(&program, 5));
    Register("brush");
    manager->OnDestroyContext();
    gl.driver.ForgetLog();
    const SimContext restored(gl.driver);
    gl.driver.ForgetCalls();

    manager->OnRestoreContext();

    void* const dead = gl.context.Handle();
    void* const alive = restored.Handle();
    EXPECT_EQ(Infos(),
              (Texts{"void Nib::ShaderManager::OnRestoreContext()",
                     Text("void Nib::ShaderManager::OnRestoreContext() Release(brush, %p)", dead),
                     Text("void Nib::ShaderManager::OnRestoreContext() Release(pen, %p)", dead),
                     Text("void Nib::ShaderManager::OnRestoreContext() Restore(brush, %p)", alive),
                     Text("void Nib::ShaderManager::OnRestoreContext() Restore(pen, %p)", alive)}));
    EXPECT_EQ(gl.driver.Log().size(), 5u);
    for (const std::string& name : gl.driver.CallNames())
        EXPECT_EQ(name, "eglGetCurrentContext");
    ShaderManager::Entry pen;
    EXPECT_TRUE(manager->Find("pen", &pen)); // under the context that is now current
    EXPECT_EQ(pen.program, &program);
    EXPECT_EQ(pen.useCount, 5u);
    EXPECT_TRUE(manager->Remove("pen"));
    EXPECT_TRUE(manager->Remove("brush"));
    EXPECT_EQ(manager->Size(), 0u); // nothing stayed under the dead context
}

TEST_F(ShaderManagerTest, ShadersOfOtherContextsStay)
{
    SimContext other(gl.driver);
    Register("brush");
    const ShaderManager::Key others("brush");
    gl.context.MakeCurrent();
    manager->OnDestroyContext();
    const SimContext restored(gl.driver);
    gl.driver.ForgetLog();

    manager->OnRestoreContext();

    EXPECT_EQ(Infos(), (Texts{"void Nib::ShaderManager::OnRestoreContext()"}));
    EXPECT_FALSE(IsRegistered("brush"));
    EXPECT_TRUE(manager->Remove(others));
}

TEST_F(ShaderManagerTest, OfTwoDestroyedContextsTheSecondCounts)
{
    Register("first");
    const ShaderManager::Key first("first");
    manager->OnDestroyContext();
    const SimContext second(gl.driver);
    Register("second");
    manager->OnDestroyContext();
    const SimContext third(gl.driver);

    manager->OnRestoreContext();

    EXPECT_TRUE(manager->Remove("second"));
    EXPECT_FALSE(manager->Remove("first"));
    EXPECT_TRUE(manager->Remove(first));
}

TEST_F(ShaderManagerTest, ARestoreUsesUpWhatWasDestroyed)
{
    manager->OnDestroyContext();
    manager->OnRestoreContext();
    Register("brush");
    const ShaderManager::Key brush("brush");
    const SimContext next(gl.driver);
    gl.driver.ForgetLog();

    manager->OnRestoreContext();

    EXPECT_EQ(Infos(), (Texts{"void Nib::ShaderManager::OnRestoreContext()"}));
    EXPECT_TRUE(manager->Remove(brush));
}

TEST_F(ShaderManagerTest, EachQueueHasItsOwnDestroyedContext)
{
    Register("brush");
    const ShaderManager::Key brush("brush");
    manager->OnDestroyContext();
    const SimContext restored(gl.driver);
    {
        BoundQueue other;
        manager->OnRestoreContext();
        EXPECT_TRUE(manager->Find(brush, nullptr)); // not this queue's context
    }
    AttachToThread(&queue);
    manager->OnRestoreContext();
    EXPECT_TRUE(manager->Remove("brush"));
}

TEST_F(ShaderManagerTest, AThreadWithoutAQueueCountsAsAQueue)
{
    AttachToThread(nullptr);
    Register("brush");
    manager->OnDestroyContext();
    const SimContext restored(gl.driver);
    manager->OnRestoreContext();
    EXPECT_TRUE(manager->Remove("brush"));
}

TEST_F(ShaderManagerTest, AMovedEntryReplacesTheOneOfItsNewKey)
{
    int newer = 0;
    manager->Add("brush", EntryOf(&program, 5));
    manager->OnDestroyContext();
    const SimContext restored(gl.driver);
    manager->Add("brush", EntryOf(&newer, 6));

    manager->OnRestoreContext();

    ShaderManager::Entry found;
    EXPECT_TRUE(manager->Find("brush", &found));
    EXPECT_EQ(found.program, &program);
    EXPECT_EQ(found.useCount, 5u);
    EXPECT_EQ(manager->Size(), 1u);
    EXPECT_TRUE(manager->Remove("brush"));
}

TEST_F(ShaderManagerTest, TheHooksRunAsTasks)
{
    Register("brush");
    using Hook = WorkerTask::Member0<ShaderManager, void (ShaderManager::*)()>;
    queue.enQueueMsg(new Hook(manager, &ShaderManager::OnDestroyContext));
    const SimContext restored(gl.driver);
    queue.enQueueMsg(new Hook(manager, &ShaderManager::OnRestoreContext));
    EXPECT_TRUE(manager->Remove("brush"));
}

// ---- what is left behind ------------------------------------------------------------------------

TEST_F(ShaderManagerTest, ReportsThatAllIsClean)
{
    manager->CheckEmpty();
    EXPECT_EQ(Infos(), (Texts{"void Nib::ShaderManager::CheckEmpty() All shaders was cleaned"}));
    EXPECT_EQ(gl.driver.Log().size(), 1u);
}

TEST_F(ShaderManagerTest, ReportsTheShadersOfTheCurrentContext)
{
    Register("pen");
    Register("brush");

    manager->CheckEmpty();

    EXPECT_EQ(Errors(), (Texts{"void Nib::ShaderManager::CheckEmpty() RESOURCE LEAK. Shader brush "
                               "is not destroyed",
                               "void Nib::ShaderManager::CheckEmpty() RESOURCE LEAK. Shader pen "
                               "is not destroyed"}));
    EXPECT_EQ(gl.driver.Log().size(), 2u);
    EXPECT_TRUE(manager->Remove("pen")); // nothing was removed
    EXPECT_TRUE(manager->Remove("brush"));
}

TEST_F(ShaderManagerTest, SaysNothingAboutShadersOfOtherContexts)
{
    Register("brush");
    const ShaderManager::Key brush("brush");
    const SimContext other(gl.driver);

    manager->CheckEmpty();

    EXPECT_TRUE(gl.driver.Log().empty());
    EXPECT_TRUE(manager->Remove(brush));
}

// The manager ends with the process; what it then writes goes to standard error here.
TEST(ShaderManagerDeathTest, AtTheExitReportsWhatIsLeft)
{
    testing::GTEST_FLAG(death_test_style) = "threadsafe";
    const auto leave = []
    {
        auto* const gl = new GlContext;
        ShaderManager::GetInstance()->Add("pen", {});
        ShaderManager::GetInstance()->Add("brush", {});
        gl->driver.PrintLog(true);
        std::exit(0);
    };
    EXPECT_EXIT(leave(), testing::ExitedWithCode(0),
                "\\[4\\] nib_log: Nib::ShaderManager::~ShaderManager\\(\\) Cleanup\\.\n"
                "\\[6\\] nib_log: Nib::ShaderManager::~ShaderManager\\(\\) RESOURCE LEAK\\. Shader "
                "brush is not destroyed\n"
                "\\[6\\] nib_log: Nib::ShaderManager::~ShaderManager\\(\\) RESOURCE LEAK\\. Shader "
                "pen is not destroyed\n");
}

// ---- several render threads ---------------------------------------------------------------------

TEST(ShaderManagerThreads, ContextsOfSeveralThreadsAreRestoredIndependently)
{
    GlContext gl;
    ShaderManager* const manager = ShaderManager::GetInstance();
    constexpr int kThreads = 4;
    int found[kThreads] = {};
    const auto lose = [&](int index)
    {
        BoundQueue queue;
        SimContext first(gl.driver);
        for (int round = 0; round < 50; ++round)
        {
            first.MakeCurrent();
            const ShaderManager::Key old("brush"); // of every thread; the contexts differ
            ShaderManager::Entry entry;
            entry.useCount = static_cast<uint32_t>(100 * index + round);
            manager->Add(old, entry);
            manager->OnDestroyContext();
            const SimContext next(gl.driver);
            manager->OnRestoreContext();
            ShaderManager::Entry moved;
            found[index] += manager->Find("brush", &moved) && moved.useCount == entry.useCount;
            manager->Remove("brush");
            manager->CheckEmpty();
        }
    };
    std::vector<std::thread> threads;
    for (int index = 0; index < kThreads; ++index)
        threads.emplace_back(lose, index);
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_TRUE(std::all_of(found, found + kThreads, [](int count) { return count == 50; }));
    EXPECT_EQ(manager->Size(), 0u);
}

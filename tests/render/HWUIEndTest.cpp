// The HWUI render thread: deletion, and the observer that all of them share.

#include "render/HWUITestSupport.h"

#include "render/HWUIObjectObserver.h"

#include <nib/shader_manager.h>

using namespace Nib;
using Nib::GLES::HWUIObjectObserver;
using Nib::GLES::HWUIThreadGLImpl;

namespace
{

TEST_F(HwuiTest, DeletionRunsTheWaitingTasksWithTheQueueBound)
{
    thread->Render();
    std::vector<IGLMsgQueue*> seen;
    IGLMsgQueue* queue = Queue();
    AttachToThread(nullptr);
    Post(queue, [&] { seen.push_back(GetCurrentMsgQueue()); });
    Post(queue, [&] { seen.push_back(GetCurrentMsgQueue()); });

    thread.reset();

    EXPECT_EQ(seen, (std::vector<IGLMsgQueue*>{queue, queue}));
}

TEST_F(HwuiTest, DeletionWritesItsLinesInOrder)
{
    thread->Render();
    Post(Queue(), [] {});
    const std::string self = Hex(thread.get());
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I HWUIThreadGLImpl::~HWUIThreadGLImpl Destructor : " + self,
                     "I virtual Nib::GLES::HWUIThreadGLImpl::~HWUIThreadGLImpl() RenderThread: " +
                         self + ", Context: " + Hex(context->Handle()),
                     "D HWUIThreadGLImpl::RunTasks count=1",
                     "D virtual Nib::GLES::HWUIThreadGLImpl::~HWUIThreadGLImpl(). queue[0].count=0 "
                     "m_pushQueueIndex=1",
                     "D virtual Nib::GLES::HWUIThreadGLImpl::~HWUIThreadGLImpl(). queue[1].count=0 "
                     "m_pushQueueIndex=1",
                     "I OnTrim not detected, checking for leaks",
                     "I bool Nib::GLES::HWUIObjectObserver::Release() - Destroy HWUIObjectObserver",
                     "I void Nib::ShaderManager::CheckEmpty() All shaders was cleaned"}));
}

TEST_F(HwuiTest, DeletionLeavesTheGLStateAsItWas)
{
    thread->Render();
    glEnable(GL_SCISSOR_TEST);
    glDisable(GL_BLEND);
    Post(Queue(),
         []
         {
             glDisable(GL_SCISSOR_TEST);
             glEnable(GL_BLEND);
         });

    thread.reset();

    EXPECT_TRUE(glIsEnabled(GL_SCISSOR_TEST));
    EXPECT_FALSE(glIsEnabled(GL_BLEND));
}

TEST_F(HwuiTest, DeletionRunsWhatItsTasksPost)
{
    thread->Render();
    int ran = 0;
    Post(Queue(), [&] { Post(Queue(), [&] { ++ran; }); });
    driver.ForgetLog();

    // The object is alive until its destructor is through, the unique pointer is not.
    delete thread.get();
    static_cast<void>(thread.release());

    EXPECT_EQ(ran, 1);
    EXPECT_EQ(driver.CountLogContaining("RunTasks count=2"), 1u);
}

TEST_F(HwuiTest, DeletionCountsAndDeletesWhatIsLeftInTheOtherQueue)
{
    thread->Render(); // pushes to queue 1
    auto token = std::make_shared<int>(0);
    HWUIThreadGLImpl* self = thread.get();
    int ran = 0;
    Post(Queue(),
         [&ran, self, token]
         {
             self->Render(); // pushes to queue 0
             Post(self->GetMsgQueue(), [&ran, token] { ++ran; });
         });
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(ran, 0);
    EXPECT_EQ(token.use_count(), 1); // deleted all the same
    EXPECT_EQ(LinesWith(driver, "queue["),
              Lines({"D virtual Nib::GLES::HWUIThreadGLImpl::~HWUIThreadGLImpl(). queue[0].count=1 "
                     "m_pushQueueIndex=0",
                     "D virtual Nib::GLES::HWUIThreadGLImpl::~HWUIThreadGLImpl(). queue[1].count=0 "
                     "m_pushQueueIndex=0"}));
}

TEST_F(HwuiTest, DeletionWithoutAContextDeletesTheTasksUnrun)
{
    thread->Render();
    int ran = 0;
    auto token = std::make_shared<int>(0);
    for (int i = 0; i < 3; ++i)
        Post(Queue(), [&ran, token] { ++ran; });
    context->Release();
    driver.ForgetLog();
    driver.ForgetCalls();

    thread.reset();

    EXPECT_EQ(ran, 0);
    EXPECT_EQ(token.use_count(), 1);
    EXPECT_EQ(LinesWith(driver, "EGL_NO_CONTEXT"),
              Lines({"I virtual Nib::GLES::HWUIThreadGLImpl::~HWUIThreadGLImpl(). EGL_NO_CONTEXT. "
                     "Clean up the queue"}));
    EXPECT_EQ(driver.CountLogContaining("queue["), 0u);
    EXPECT_EQ(driver.CountLogContaining("RunTasks"), 0u);
    EXPECT_EQ(driver.CountLogContaining("Context: (nil)"), 1u);
    context->MakeCurrent();
}

TEST_F(HwuiTest, DeletionWithoutAContextDeletesTheTasksOfTheOtherQueueToo)
{
    int ran = 0;
    auto token = std::make_shared<int>(0);
    Post(Queue(), [&ran, token] { ++ran; }); // no frame yet: behind the first task
    context->Release();

    thread.reset();

    EXPECT_EQ(ran, 0);
    EXPECT_EQ(token.use_count(), 1);
    context->MakeCurrent();
}

TEST_F(HwuiTest, DeletionOfAThreadThatNeverDrewRunsItsInit)
{
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(driver.CountLogContaining("HWUIThreadGLImpl::Init() RenderThread: "), 1u);
    EXPECT_EQ(driver.CountLogContaining("RunTasks count=1"), 1u);
}

TEST_F(HwuiTest, DeletionAfterAPauseSaysSo)
{
    thread->Render();
    thread->OnPause();
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(LinesWith(driver, "OnTrim"),
              Lines({"I OnTrim was detected, printing resources left in database"}));
}

TEST_F(HwuiTest, DeletionAfterAPauseAndAResumeStillSaysSo)
{
    thread->Render();
    thread->OnPause();
    thread->OnResume();
    thread->Render();
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(LinesWith(driver, "OnTrim"),
              Lines({"I OnTrim was detected, printing resources left in database"}));
}

TEST_F(HwuiTest, DeletionLeavesNoDeadQueueBehind)
{
    thread->Render();

    thread.reset();

    EXPECT_EQ(GetCurrentMsgQueue(), nullptr);
}

TEST_F(HwuiTest, DeletionLeavesTheQueueOfAnotherThreadBound)
{
    KeepingQueue other;
    Post(Queue(), [&] { AttachToThread(&other); });

    thread.reset();

    EXPECT_EQ(GetCurrentMsgQueue(), &other);
    AttachToThread(nullptr);
}

TEST_F(HwuiTest, OneOfTwoThreadsKeepsTheObserver)
{
    auto second = std::make_unique<HWUIThreadGLImpl>(&callback, "second");
    EXPECT_EQ(driver.CountLogContaining("Create new instance"), 1u);
    driver.ForgetLog();

    thread.reset();
    EXPECT_EQ(driver.CountLogContaining("Destroy HWUIObjectObserver"), 0u);
    EXPECT_EQ(driver.CountLogContaining("CheckEmpty"), 0u);

    second.reset();
    EXPECT_EQ(driver.CountLogContaining("Destroy HWUIObjectObserver"), 1u);
    EXPECT_EQ(driver.CountLogContaining("CheckEmpty"), 1u);
}

TEST_F(HwuiTest, TheLastThreadReportsTheShadersThatAreLeft)
{
    ShaderManager::GetInstance()->Add(ShaderManager::Key("ink"), {});
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(LinesWith(driver, "RESOURCE LEAK"),
              Lines({"E void Nib::ShaderManager::CheckEmpty() RESOURCE LEAK. Shader ink is not "
                     "destroyed"}));
    ShaderManager::GetInstance()->Remove(ShaderManager::Key("ink"));
}

// ---- the observer -------------------------------------------------------------------------------

TEST(HWUIObjectObserver, IsMadeOnceAndCounted)
{
    SimDriver driver;

    HWUIObjectObserver* observer = HWUIObjectObserver::GetInstance();
    EXPECT_EQ(HWUIObjectObserver::GetInstance(), observer);

    EXPECT_FALSE(observer->Release());
    EXPECT_TRUE(observer->Release());
    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I static Nib::GLES::HWUIObjectObserver "
                     "*Nib::GLES::HWUIObjectObserver::GetInstance() - Create new instance",
                     "I bool Nib::GLES::HWUIObjectObserver::Release() - Destroy "
                     "HWUIObjectObserver"}));
}

TEST(HWUIObjectObserver, IsMadeAnewAfterItsEnd)
{
    SimDriver driver;
    HWUIObjectObserver::GetInstance()->Release();

    HWUIObjectObserver* observer = HWUIObjectObserver::GetInstance();

    EXPECT_EQ(driver.CountLogContaining("Create new instance"), 2u);
    EXPECT_TRUE(observer->Release());
}

TEST(HWUIObjectObserver, ReportsTheSubscribersThatItsEndFinds)
{
    SimDriver driver;
    std::vector<std::string> notes;
    NotedObject object("object", &notes);
    HWUIObjectObserver* observer = HWUIObjectObserver::GetInstance();
    observer->Subscribe(&object);

    observer->Release();

    EXPECT_EQ(
        driver.CountLogContaining("Subscriber list is not empty: 1 objects still subscribed."), 1u);
}

TEST(HWUIObjectObserver, IsSafeForManyThreads)
{
    SimDriver driver;
    std::vector<std::thread> users;
    std::atomic<int> destroyed{0};
    for (int i = 0; i < 4; ++i)
    {
        users.emplace_back(
            [&]
            {
                for (int round = 0; round < 500; ++round)
                    destroyed += HWUIObjectObserver::GetInstance()->Release() ? 1 : 0;
            });
    }
    for (std::thread& user : users)
        user.join();

    EXPECT_GT(destroyed, 0);
    EXPECT_EQ(driver.CountLogContaining("Create new instance"),
              static_cast<std::size_t>(destroyed));
    EXPECT_EQ(driver.CountLogContaining("Destroy HWUIObjectObserver"),
              static_cast<std::size_t>(destroyed));
}

} // namespace

#ifndef NIB_BENCH_EXECUTORS_H
#define NIB_BENCH_EXECUTORS_H

// Threads that run what is posted to them: the library's worker and its peers, behind one face.
// Each has Post(function), from any thread. The destructor runs what was posted, and ends.

#include <nib/task.h>
#include <nib/worker_thread.h>

#include <boost/asio/io_context.hpp>
#include <boost/asio/post.hpp>
#include <concurrentqueue/blockingconcurrentqueue.h>
#include <tbb/global_control.h>
#include <tbb/task_arena.h>
#include <uv.h>

#include <atomic>
#include <condition_variable>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>
#include <utility>
#include <vector>

template <typename Function>
class CallTask : public Nib::ITask
{
public:
    explicit CallTask(Function function) : m_function(std::move(function)) {}
    void run() override { m_function(); }

private:
    Function m_function;
};

/// A worker of the library, or a pool of them.
class NibExecutor
{
public:
    explicit NibExecutor(int threads)
        : m_worker(threads == 1 ? Nib::IWorkerThread::CreateInstance_NoLock("bench", 0)
                                : Nib::IWorkerThread::CreatePoolInstance("bench", 0, threads))
    {
        m_worker->Start(false);
    }
    ~NibExecutor() { m_worker->Terminate(); }

    template <typename Function>
    void Post(Function function)
    {
        m_worker->EnqueueAsyncTask(new CallTask<Function>(std::move(function)));
    }

    Nib::IWorkerThread& Worker() { return *m_worker; }

private:
    std::unique_ptr<Nib::IWorkerThread> m_worker;
};

using Work = std::function<void()>;

/// What most programs write first: a mutex, a condition, a deque.
class LockedDequeExecutor
{
public:
    explicit LockedDequeExecutor(int threads)
    {
        for (int number = 0; number < threads; ++number)
            m_threads.emplace_back([this] { Run(); });
    }
    ~LockedDequeExecutor()
    {
        for (std::size_t number = 0; number < m_threads.size(); ++number)
            Post(nullptr);
        for (std::thread& thread : m_threads)
            thread.join();
    }

    void Post(Work work)
    {
        const std::lock_guard lock(m_mutex);
        m_works.push_back(std::move(work));
        m_filled.notify_one();
    }

private:
    void Run()
    {
        while (const Work work = Take())
            work();
    }

    Work Take()
    {
        std::unique_lock lock(m_mutex);
        m_filled.wait(lock, [this] { return !m_works.empty(); });
        Work work = std::move(m_works.front());
        m_works.pop_front();
        return work;
    }

    std::mutex m_mutex;
    std::condition_variable m_filled;
    std::deque<Work> m_works;
    std::vector<std::thread> m_threads;
};

class MoodycamelExecutor
{
public:
    explicit MoodycamelExecutor(int threads)
    {
        for (int number = 0; number < threads; ++number)
            m_threads.emplace_back([this] { Run(); });
    }
    ~MoodycamelExecutor()
    {
        // Works of different producers have no order: only when all are done may the ends come.
        while (m_done.load() != m_posted.load())
            std::this_thread::yield();
        for (std::size_t number = 0; number < m_threads.size(); ++number)
            m_works.enqueue(nullptr);
        for (std::thread& thread : m_threads)
            thread.join();
    }

    void Post(Work work)
    {
        m_posted.fetch_add(1, std::memory_order_relaxed);
        m_works.enqueue(std::move(work));
    }

private:
    void Run()
    {
        Work work;
        for (m_works.wait_dequeue(work); work; m_works.wait_dequeue(work))
        {
            work();
            m_done.fetch_add(1, std::memory_order_relaxed);
        }
    }

    moodycamel::BlockingConcurrentQueue<Work> m_works;
    std::atomic<long> m_posted{0};
    std::atomic<long> m_done{0};
    std::vector<std::thread> m_threads;
};

class AsioExecutor
{
public:
    explicit AsioExecutor(int threads) : m_context(threads), m_guard(m_context.get_executor())
    {
        for (int number = 0; number < threads; ++number)
            m_threads.emplace_back([this] { m_context.run(); });
    }
    ~AsioExecutor()
    {
        m_guard.reset();
        for (std::thread& thread : m_threads)
            thread.join();
    }

    template <typename Function>
    void Post(Function function)
    {
        boost::asio::post(m_context, std::move(function));
    }

private:
    boost::asio::io_context m_context;
    boost::asio::executor_work_guard<boost::asio::io_context::executor_type> m_guard;
    std::vector<std::thread> m_threads;
};

/// An arena whose threads are the scheduler's; the posting thread is not one of them.
class TbbExecutor
{
public:
    explicit TbbExecutor(int threads)
        : m_threads(tbb::global_control::max_allowed_parallelism,
                    static_cast<std::size_t>(threads) + 1),
          m_arena(threads, 0)
    {
    }
    ~TbbExecutor()
    {
        while (m_done.load() != m_posted.load())
            std::this_thread::yield();
    }

    template <typename Function>
    void Post(Function function)
    {
        m_posted.fetch_add(1, std::memory_order_relaxed);
        m_arena.enqueue(
            [this, function = std::move(function)]
            {
                function();
                m_done.fetch_add(1, std::memory_order_relaxed);
            });
    }

private:
    tbb::global_control m_threads;
    tbb::task_arena m_arena;
    std::atomic<long> m_posted{0};
    std::atomic<long> m_done{0};
};

/// An event loop: it has a wake-up that any thread may use, and a list beside it.
class UvExecutor
{
public:
    explicit UvExecutor(int)
    {
        uv_loop_init(&m_loop);
        uv_async_init(&m_loop, &m_wake,
                      [](uv_async_t* wake) { static_cast<UvExecutor*>(wake->data)->RunAll(); });
        m_wake.data = this;
        m_thread = std::thread([this] { uv_run(&m_loop, UV_RUN_DEFAULT); });
    }
    ~UvExecutor()
    {
        Post([this] { uv_close(reinterpret_cast<uv_handle_t*>(&m_wake), nullptr); });
        m_thread.join();
        uv_loop_close(&m_loop);
    }

    void Post(Work work)
    {
        {
            const std::lock_guard lock(m_mutex);
            m_works.push_back(std::move(work));
        }
        uv_async_send(&m_wake);
    }

private:
    void RunAll()
    {
        std::deque<Work> works;
        {
            const std::lock_guard lock(m_mutex);
            works.swap(m_works);
        }
        for (const Work& work : works)
            work();
    }

    uv_loop_t m_loop{};
    uv_async_t m_wake{};
    std::mutex m_mutex;
    std::deque<Work> m_works;
    std::thread m_thread;
};

#endif

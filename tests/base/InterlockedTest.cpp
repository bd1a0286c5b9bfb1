#include <nib/base.h>

#include <gtest/gtest.h>

#include <thread>
#include <vector>

using namespace Nib;

TEST(Interlocked, IncrementReturnsTheNewValue)
{
    volatile std::int32_t value = 6;
    EXPECT_EQ(InterlockedIncrement(&value), 7);
    EXPECT_EQ(value, 7);

    std::atomic<std::int32_t> atomic{-1};
    EXPECT_EQ(InterlockedIncrement(&atomic), 0);
    EXPECT_EQ(atomic.load(), 0);
}

TEST(Interlocked, DecrementReturnsTheNewValue)
{
    volatile std::int32_t value = 1;
    EXPECT_EQ(InterlockedDecrement(&value), 0);
    EXPECT_EQ(value, 0);

    std::atomic<std::int32_t> atomic{0};
    EXPECT_EQ(InterlockedDecrement(&atomic), -1);
    EXPECT_EQ(atomic.load(), -1);
}

TEST(Interlocked, ExchangePointerReturnsTheOldOne)
{
    int first = 0;
    int second = 0;
    void* volatile pointer = &first;
    EXPECT_EQ(InterlockedExchangePointer(&pointer, &second), &first);
    EXPECT_EQ(pointer, &second);

    std::atomic<int*> atomic{&first};
    EXPECT_EQ(InterlockedExchangePointer(&atomic, &second), &first);
    EXPECT_EQ(atomic.load(), &second);
}

TEST(Interlocked, CountsFromSeveralThreads)
{
    volatile std::int32_t up = 0;
    std::atomic<std::int32_t> down{200000};
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i)
    {
        threads.emplace_back(
            [&]
            {
                for (int n = 0; n < 50000; ++n)
                {
                    InterlockedIncrement(&up);
                    InterlockedDecrement(&down);
                }
            });
    }
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(up, 200000);
    EXPECT_EQ(down.load(), 0);
}

#ifndef NIB_TESTS_MODEL_MEMORY_H
#define NIB_TESTS_MODEL_MEMORY_H

#include <atomic>
#include <cstdint>
#include <vector>

// The memory of an execution, after C++20. Every atomic keeps all values that it had. A thread has a
// view: for each atomic, the oldest value that it may still read. Releasing publishes the view with
// the value, acquiring takes it over. Sequentially consistent accesses of one atomic never read
// what an earlier one has passed. Not modelled: a load that returns a value from the future, and
// stores that are ordered before older stores of other threads; neither occurs in code in which one
// thread at a time stores plainly to an atomic.

namespace Model
{

/// What a thread, or what a value was published with, has seen.
struct View
{
    std::vector<int> values; ///< of each atomic, the index of the newest value seen; 0 is none
    std::vector<int> steps;  ///< of each thread, how many of its steps came before

    void Join(const View& other);
    int Value(int atomic) const;
    void See(int atomic, int value);
    int Steps(int thread) const;
};

/// Which orders are taken for weaker ones: a test shows with each of them that it is needed.
struct Weakening
{
    bool exchangeRelease = false;
    bool exchangeAcquire = false;
    bool storeRelease = false;
    bool loadAcquire = false;
    bool addSequential = false;  ///< sequentially consistent additions and loads become
    bool loadSequential = false; ///< acquire and release
};
extern Weakening g_weakening;

void ForgetMemory();
void InheritView(int thread);
void SeeAllOf(int thread);

/// The calling thread's view.
View& MyView();

/// The view that a lock or a condition hands on.
void HandOn(View& view);
void TakeOver(const View& view);

int NewAtomic(std::uint64_t value);
void EndAtomic(int atomic);
std::uint64_t Load(int atomic, std::memory_order order);
void Store(int atomic, std::uint64_t value, std::memory_order order);

/// The newest value, in one step with storing what comes of it.
std::uint64_t BeginChange(int atomic, std::memory_order order);
void EndChange(int atomic, std::uint64_t value, std::memory_order order);

/// A plain variable: fails the execution when two threads are not ordered.
class Plain
{
public:
    void Write();
    void Read();

private:
    struct Access
    {
        int thread;
        int step;
    };
    static bool IsBefore(const Access& access);

    std::vector<Access> m_reads;
    std::vector<Access> m_writes; ///< the last one
};

} // namespace Model

#endif

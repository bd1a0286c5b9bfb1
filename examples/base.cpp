// The base library: a thread, a lock with a condition, and a file.

#include <nib/base.h>

#include <cstdio>
#include <cstring>

namespace
{

struct Mailbox
{
    Nib::CriticalSection lock{false};
    Nib::ConditionalVariable filled;
    bool isFull = false;
};

void Fill(void* argument)
{
    auto* const mailbox = static_cast<Mailbox*>(argument);
    Nib::AutoCriticalSection lock(mailbox->lock);
    mailbox->isFull = true;
    mailbox->filled.Signal();
}

} // namespace

int main()
{
    using namespace Nib;
    Mailbox mailbox;
    Thread thread(&Fill, &mailbox, "example", 0);
    mailbox.lock.Enter();
    const bool isStarted = thread.start();
    // One wait, without a loop: it ends with a signal that came after it began, or not at all.
    const bool wasSignalled = isStarted && mailbox.filled.Wait(&mailbox.lock, -1);
    const bool isFull = mailbox.isFull;
    mailbox.lock.Leave();
    thread.join();

    const char* const name = "example-base.tmp";
    const String path(name);
    char text[8] = {};
    File file;
    file.Construct(&path, "wb", false);
    const std::size_t written = file.Write("ink", 1, 3);
    file.Construct(&path, "rb", false);
    const std::size_t read = file.Read(text, 1, sizeof text);
    file.Close();
    File::Unlink(&path);
    std::printf("signalled %d, read \"%s\"\n", wasSignalled, text);
    return wasSignalled && isFull && written == 3 && read == 3 && std::strcmp(text, "ink") == 0 ? 0
                                                                                                : 1;
}

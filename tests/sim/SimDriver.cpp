#include "SimDriver.h"

#include "SimState.h"

#include <gtest/gtest.h>
#include <nib/base.h>

#include <algorithm>
#include <ostream>
#include <set>

using Sim::GetState;
using Sim::State;

namespace
{

/// The state, locked for one operation of the driver.
struct Locked
{
    State& state = GetState();
    std::lock_guard<std::mutex> lock{state.mutex};

    State* operator->() { return &state; }
};

} // namespace

std::ostream& operator<<(std::ostream& out, const SimLogLine& line)
{
    return out << line.priority << " " << line.tag << ": " << line.text;
}

SimDriver::SimDriver(SimGpu gpu)
{
    Nib::System::SetDesktopFallbacks(false); // a device is played, to the bit
    ForgetLog();
    PrintLog(false);
    Locked state;
    if (state->driverAlive)
        ADD_FAILURE() << "there is a simulated driver already";
    state->Reset(std::move(gpu));
    state->driverAlive = true;
}

SimDriver::~SimDriver()
{
    std::vector<std::pair<std::string, std::string>> offences;
    std::set<std::string> expected;
    std::vector<std::string> misuses;
    {
        Locked state;
        state->driverAlive = false;
        state->held.clear();
        state->actions.clear();
        state->failures.clear();
        state->pace = SimPace::Instant;
        offences.swap(state->offences);
        expected.swap(state->expectedMisuse);
        misuses = state->misuses;
        state->changed.notify_all();
    }
    for (const auto& [name, text] : offences)
        ADD_FAILURE() << text;
    for (const std::string& name : expected)
    {
        const auto isOfName = [&](const std::string& text)
        { return text.rfind(name + ":", 0) == 0; };
        if (std::none_of(misuses.begin(), misuses.end(), isOfName))
            ADD_FAILURE() << "no misuse of " << name;
    }
}

const SimGpu& SimDriver::Gpu() const
{
    return GetState().gpu;
}

void SimDriver::ForgetCalls()
{
    Locked state;
    state->calls.clear();
    state->draws.clear();
    state->callsMade = 0;
}

void SimDriver::RecordCalls(bool on)
{
    Locked()->recording = on;
}

std::vector<SimCall> SimDriver::Calls() const
{
    return Locked()->calls;
}

std::vector<SimCall> SimDriver::Calls(const char* name) const
{
    return Calls({name});
}

std::vector<SimCall> SimDriver::Calls(std::initializer_list<const char*> names) const
{
    Locked state;
    std::vector<SimCall> found;
    std::copy_if(state->calls.begin(), state->calls.end(), std::back_inserter(found),
                 [&](const SimCall& call)
                 { return std::find(names.begin(), names.end(), call.name) != names.end(); });
    return found;
}

std::vector<std::string> SimDriver::CallNames() const
{
    Locked state;
    std::vector<std::string> names;
    for (const SimCall& call : state->calls)
        names.push_back(call.name);
    return names;
}

std::vector<std::string> SimDriver::CallTexts() const
{
    Locked state;
    std::vector<std::string> texts;
    for (const SimCall& call : state->calls)
        texts.push_back(call.ToString());
    return texts;
}

std::size_t SimDriver::CallCount() const
{
    return Locked()->calls.size();
}

std::size_t SimDriver::CallCount(const char* name) const
{
    return Calls({name}).size();
}

SimCall SimDriver::LastCall(const char* name) const
{
    const std::vector<SimCall> calls = Calls({name});
    if (!calls.empty())
        return calls.back();
    ADD_FAILURE() << name << " was not called";
    return {};
}

unsigned SimDriver::CallingThreads() const
{
    Locked state;
    std::set<unsigned> threads;
    for (const SimCall& call : state->calls)
        threads.insert(call.thread);
    return static_cast<unsigned>(threads.size());
}

unsigned SimDriver::ThisThread()
{
    return Sim::ThreadNumber();
}

void SimDriver::FailNext(const char* name, unsigned error, int times)
{
    Locked()->failures.push_back({name, std::nullopt, error, times});
}

void SimDriver::FailWhen(const char* name, std::size_t index, const SimValue& value, unsigned error,
                         int times)
{
    Locked()->failures.push_back({name, std::pair{index, value}, error, times});
}

void SimDriver::FailAt(std::size_t n, unsigned eglError, unsigned glError)
{
    Locked state;
    state->failAt = n;
    state->failAtEglError = eglError;
    state->failAtGlError = glError;
}

void SimDriver::LoseContextsAt(std::size_t n)
{
    Locked()->loseContextsAt = n;
}

std::size_t SimDriver::CallsMade() const
{
    return Locked()->callsMade;
}

void SimDriver::ForgetFailures()
{
    Locked state;
    state->failures.clear();
    state->failAt = 0;
    state->loseContextsAt = 0;
    state->compileFailures.clear();
    state->linkFailures.clear();
}

void SimDriver::QueueGlErrors(std::initializer_list<GLenum> errors)
{
    Locked state;
    Sim::Context* context = state->CurrentThread().context;
    if (!context)
        ADD_FAILURE() << "QueueGlErrors: no context is current on this thread";
    else
        context->gl.errors.insert(context->gl.errors.end(), errors.begin(), errors.end());
}

void SimDriver::SetGlString(GLenum name, std::optional<std::string> text)
{
    Locked()->glStrings[name] = std::move(text);
}

void SimDriver::SetConfigCounts(int counted, int given)
{
    Locked state;
    state->configsCounted = counted;
    state->configsGiven = given;
}

void SimDriver::SetInitialApi(EGLenum api)
{
    Locked()->initialApi = api;
}

void SimDriver::FailCompile(std::string log)
{
    Locked()->compileFailures.push_back(std::move(log));
}

void SimDriver::FailLink(std::string log)
{
    Locked()->linkFailures.push_back(std::move(log));
}

void SimDriver::OnCall(const char* name, std::function<void()> action)
{
    Locked state;
    if (action)
        state->actions[name] = std::move(action);
    else
        state->actions.erase(name);
}

void SimDriver::Hold(const char* name)
{
    Locked()->held.insert(name);
}

void SimDriver::Release(const char* name)
{
    Locked state;
    state->held.erase(name);
    state->changed.notify_all();
}

void SimDriver::WaitUntilHeld(const char* name)
{
    State& state = GetState();
    std::unique_lock lock(state.mutex);
    state.changed.wait(lock, [&] { return state.blocked[name] > 0; });
}

void SimDriver::SetPace(SimPace pace)
{
    Locked()->pace = pace;
}

void SimDriver::AllowMisuse(const char* name)
{
    Locked state;
    if (name)
        state->allowedMisuse.insert(name);
    else
        state->allMisuseAllowed = true;
}

void SimDriver::ExpectMisuse(const char* name)
{
    AllowMisuse(name);
    Locked()->expectedMisuse.insert(name);
}

std::vector<std::string> SimDriver::Misuses() const
{
    return Locked()->misuses;
}

void SimDriver::ForgetMisuses()
{
    Locked state;
    state->misuses.clear();
    state->offences.clear();
}

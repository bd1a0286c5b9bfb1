#ifndef NIB_TESTS_RUN_NIB_H
#define NIB_TESTS_RUN_NIB_H

#include <map>
#include <memory>
#include <string>
#include <vector>

/// What a finished run of the tool left behind.
struct NibResult
{
    int status = -1; ///< exit status; 128 + the signal when one ended it
    std::string out;
    std::string err;
};

/// A running `nib`. The destructor ends it.
class RunningNib
{
public:
    /// @p environment is added to this process's; an empty value removes the variable.
    RunningNib(const std::vector<std::string>& arguments,
               const std::map<std::string, std::string>& environment = {});
    ~RunningNib();

    RunningNib(const RunningNib&) = delete;
    RunningNib& operator=(const RunningNib&) = delete;

    /// The next line of its standard output; empty at its end.
    std::string ReadLine();

    void Stop() const; ///< it takes nothing in until Continue
    void Continue() const;

    NibResult Finish();

private:
    int m_process = -1;
    int m_out = -1;
    std::string m_errFile;
};

NibResult RunNib(const std::vector<std::string>& arguments,
                 const std::map<std::string, std::string>& environment = {});

/// A folder of this test's own, removed with its contents.
class TemporaryFolder
{
public:
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    std::string Path(const std::string& name) const { return m_path + "/" + name; }
    std::string Write(const std::string& name, const std::string& text) const;
    std::vector<std::string> Files() const;

private:
    std::string m_path;
};

/// The path of a recording that the project does not carry, or empty when NIB_STROKES is unset.
std::string FurtherRecording(const std::string& name);

#endif

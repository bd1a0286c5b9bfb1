#ifndef NIB_TESTS_FAULTS_FILE_FAULTS_H
#define NIB_TESTS_FAULTS_FILE_FAULTS_H

#include <cstddef>
#include <string>
#include <vector>

/// How one system call on a file goes wrong.
struct FileFault
{
    enum Kind
    {
        None,
        Error,     ///< it fails with `error`, and has done nothing; close() has closed
        Short,     ///< half of the bytes are read or written
        ShortOnce, ///< the same, and the next call on that file fails with `error`
        NoMore,    ///< read() finds the end of the file
        Vanish,    ///< the folder and all in it are removed just before
    };

    std::size_t call = 0; ///< number of the call, from 1
    Kind kind = None;
    int error = 0;
};

/// From now on the calls of open, read, write, close, access, mkdir, rename and unlink
/// that have to do with @p folder, or with what lies in it, are counted, and one of them goes wrong.
/// In this process; once.
void WatchFiles(const std::string& folder, const FileFault& fault);

/// The names of the counted calls, in order.
std::vector<std::string> FileCalls();

#endif

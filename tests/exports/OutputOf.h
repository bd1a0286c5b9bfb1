#ifndef NIB_TESTS_EXPORTS_OUTPUT_OF_H
#define NIB_TESTS_EXPORTS_OUTPUT_OF_H

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

/// The lines that @p command writes.
inline std::vector<std::string> OutputOf(const std::string& command)
{
    const std::unique_ptr<FILE, int (*)(FILE*)> pipe(popen(command.c_str(), "r"), pclose);
    std::vector<std::string> lines;
    if (!pipe)
        return lines;
    std::string line;
    for (int c = std::fgetc(pipe.get()); c != EOF; c = std::fgetc(pipe.get()))
    {
        if (c != '\n')
        {
            line += static_cast<char>(c);
            continue;
        }
        lines.push_back(line);
        line.clear();
    }
    return lines;
}

#endif

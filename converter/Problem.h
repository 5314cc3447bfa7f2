#pragma once
// What went wrong while converting a file: which file, where in it, and what was expected.
#include <string>

namespace converter {

struct Problem {
    std::string file;
    long line = 0;   // from 1; 0 when no line applies (binary files, setup problems)
    int column = 0;  // from 1; 0 when no column applies
    std::string message;

    // "file:line:column: message", leaving out the parts that are not known.
    std::string Describe() const;
};

// The outcome of a step that can fail: ok, or the first problem found.
class Status {
public:
    Status() = default;
    static Status Ok() { return Status(); }
    static Status Fail(std::string file, long line, std::string message, int column = 0)
    {
        Status status;
        status.m_failed = true;
        status.m_problem = Problem{std::move(file), line, column, std::move(message)};
        return status;
    }

    bool ok() const { return !m_failed; }
    explicit operator bool() const { return ok(); }
    const Problem& problem() const { return m_problem; }

private:
    bool m_failed = false;
    Problem m_problem;
};

} // namespace converter

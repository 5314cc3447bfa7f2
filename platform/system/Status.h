#pragma once
// What went wrong while reading or writing a file: which file, where in it, and what was expected.
// Every reader and writer returns a Status; only the edges whose form is fixed (a parser's int
// operation with its message box, the engine's checks, the exported functions) turn it into
// something else.
#include <memory>
#include <string>

namespace sys {

struct Problem {
    std::string file;
    long line = 0;   // from 1; 0 when no line applies (binary files, setup problems)
    int column = 0;  // from 1; 0 when no column applies
    std::string message;

    // "file:line:column: message", leaving out the parts that are not known.
    std::string Describe() const;
};

// The outcome of a step that can fail: ok, or the first problem found. An ok status holds no
// strings, so the steps run once per row (a writer's Write) create and drop it for nothing.
class Status {
public:
    Status() = default;
    Status(const Status& other) : m_problem(other.m_problem ? std::make_unique<Problem>(*other.m_problem) : nullptr) {}
    Status& operator=(const Status& other)
    {
        if (this != &other)
            m_problem = other.m_problem ? std::make_unique<Problem>(*other.m_problem) : nullptr;
        return *this;
    }
    Status(Status&&) noexcept = default;
    Status& operator=(Status&&) noexcept = default;

    static Status Ok() { return Status(); }
    static Status Fail(std::string file, long line, std::string message, int column = 0)
    {
        Status status;
        status.m_problem = std::make_unique<Problem>(Problem{std::move(file), line, column, std::move(message)});
        return status;
    }

    bool ok() const { return !m_problem; }
    explicit operator bool() const { return ok(); }
    // The problem of a failed status; an empty one for an ok status.
    const Problem& problem() const { return m_problem ? *m_problem : kNoProblem; }

private:
    static inline const Problem kNoProblem{};
    std::unique_ptr<Problem> m_problem;
};

} // namespace sys

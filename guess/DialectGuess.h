#pragma once
// How the lines of a text file split into fields: the delimiter (one of the named ones, or a user
// delimiter such as "|" or "::"), whether runs of it and delimiters at the start of a line are passed
// over, and the decimal separator of the values.
#include "guess/Sample.h"
#include "guess/TextAccess.h"

#include <optional>
#include <vector>

namespace guess {

struct DialectGuess {
    Dialect dialect;
    std::string decimalName = "Dot"; // "Dot" or "Comma"
    size_t fieldCount = 0;           // fields of a data line
    std::vector<Finding> findings;
};

// The dialect under which the data lines of `head` split most evenly into dates, times and numbers;
// nothing, with `refusal` set, when no delimiter splits them into two fields or more.
std::optional<DialectGuess> GuessDialect(const TextHead& head, Refusal& refusal);

// The rows of `head` split with `dialect` (empty lines left out, their numbers kept by the others).
Sample SplitHead(const TextHead& head, const Dialect& dialect);

// How a dialect is named for people: "Semi Colon", "User Defined \"::\"", with the flags.
std::string DescribeDialect(const Dialect& dialect);

} // namespace guess

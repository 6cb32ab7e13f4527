#ifndef MCBIN_FAILURE_H
#define MCBIN_FAILURE_H

#include <stdexcept>

/// What stopped the tool, in words for its user. main() prints them and ends with exit code 1.
class Failure : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

#endif

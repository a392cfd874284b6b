#pragma once

// Linked into a program, replaces its global operator new by one that can be made to fail.

// One allocation of this thread fails, the one behind the given number of successes; those behind it succeed
// again.
class OneFailure {
 public:
    explicit OneFailure(long successes);
    ~OneFailure();
    bool happened() const;
};

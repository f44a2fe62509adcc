// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <string>

namespace pemaro::zelkctl {

// A command runs on a thread of its own while the first thread watches over it, so that it ends in
// time whatever it waits for: a call that is not answered, a file that nobody reads, an output that
// nobody takes.

/// Runs a command and returns its exit status. SIGINT, SIGTERM and SIGHUP, and the end of whoever
/// reads the standard output, ask it to stop; when it has not within a second, or when a signal
/// comes again, or when a call takes longer than `callTimeout` seconds (0: it may), the last words
/// are spoken and the process ends, without a return. A call that takes longer than a second is shown
/// on the standard error until it is answered, if that is a terminal, and not with --json. To be called
/// once.
int supervise(const std::function<int()>& command, double callTimeout);

/// Takes away what is shown of a call, so that what is written next stands in its place. It comes back
/// while there is no answer.
void hideCall();

/// Whether the command was asked to stop.
bool mustStop();

/// The exit status of a command that was stopped before it was done; the user has been told so.
int failStopped();

/// While one lives, the command waits for something.
class Waiting {
  public:
    /// For what, as in "waiting for a reader of /tmp/fifo".
    explicit Waiting(const std::string& what) : Waiting(what, false) {}
    ~Waiting();
    Waiting(const Waiting&) = delete;
    Waiting& operator=(const Waiting&) = delete;

  protected:
    Waiting(const std::string& what, bool isCall);

  private:
    const uint64_t mNumber;
};

/// The same for the answer to an operation of a service.
class Calling : public Waiting {
  public:
    explicit Calling(const std::string& operation) : Waiting(operation, true) {}
};

/// Runs an operation of a service; what it returns.
template <typename Operation>
auto call(const std::string& name, Operation operation) {
    const Calling calling(name);
    return operation();
}

/// While one lives, the command is at work that ends by itself, soon but perhaps not within a second,
/// and that must not be left half done: it is waited for even after the first signal.
class Finishing {
  public:
    Finishing();
    ~Finishing();
    Finishing(const Finishing&) = delete;
    Finishing& operator=(const Finishing&) = delete;
};

/// What is done while it lives when the process has to end without the command: tell what was
/// reached, and what a service was not told. It runs on the first thread and must not wait.
class LastWords {
  public:
    explicit LastWords(std::function<void()> speak);
    ~LastWords();
    LastWords(const LastWords&) = delete;
    LastWords& operator=(const LastWords&) = delete;
};

}  // namespace pemaro::zelkctl

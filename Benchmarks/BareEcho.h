#pragma once

#include <cstdint>
#include <string>

typedef struct sd_bus sd_bus;

/// The floor of a call of the agent: an echo by sd-bus that commits with sqlite3 what the agent has
/// to commit for a flag of an entry. It keeps its statements, and has the settings of the agent's
/// database: a write-ahead log, and each commit on the disk.
namespace Benchmarks::BareEcho {

/// Makes a database with feed 1, a client that subscribes to it, and so many entries.
void seed(const std::string& path, int entries);

/// Serves on the user's bus until that ends, and writes "ready" when it begins to.
void serve(const char* path);

/// One that calls. All of its operations throw `std::runtime_error`.
class Caller {
 public:
    Caller();
    ~Caller();
    Caller(const Caller&) = delete;
    Caller& operator=(const Caller&) = delete;

    /// Changes whether an entry is read, and its date, and counts the unread entries of the feed.
    void call(std::int64_t row, bool value) const;

 private:
    sd_bus* mBus = nullptr;
};

}  // namespace Benchmarks::BareEcho

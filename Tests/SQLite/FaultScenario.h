#pragma once

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"
#include "SQLite/FakeCenter.h"
#include "SQLite/TestRows.h"
#include "Support/FaultVFS.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/TempDir.h"

#include <cstddef>
#include <string>
#include <vector>

/// A process's work with its database, in steps that change the file twice, with a file system that
/// fails when it is told to, a clock that takes no time, and a log that nobody sees.
///
/// A step that fails is given up where it is, and can be done again.
class FaultScenario {
 public:
    static constexpr std::size_t kSteps = 5;
    static constexpr std::size_t kReadingSteps = 2;  ///< the first ones, which do not write

    explicit FaultScenario(bool usesWriteAheadLog);
    ~FaultScenario() noexcept;
    FaultScenario(const FaultScenario&) = delete;
    FaultScenario& operator=(const FaultScenario&) = delete;

    /// Puts the file back to how it was at first.
    void begin();
    /// Does those of the first `steps` that are not done yet. Gives what stopped it, or nothing.
    std::string run(std::size_t steps = kSteps);
    /// Lets go of what is not saved, and starts again from what the file has.
    void reopen();
    /// Lets go of everything, saving nothing.
    void end();

    /// How often the file has been changed by the steps that are done.
    int savedStates() const { return mSavedStates; }
    /// How the file is after so many changes.
    const std::string& state(int changes) const { return mStates[changes]; }
    /// What stands in the file, as another connection reads it; what is wrong with it, if anything
    /// is.
    std::string fileContent() const;
    /// The rows in memory that believe to be saved and are not as the file has them.
    std::string staleRows() const;

    Support::FaultVFS vfs;

 private:
    void makeFile();
    void fillFile();
    void learnStates();
    void removeFiles() const;
    void open();
    void readRows();
    void changeRows();
    void noteChanges();
    void deleteRows();
    void vacuum();
    void changeAndClose();

    const Foundation::AutoreleasePool mPool;
    Support::LogCapture mLog;
    Support::ManualClock mClock;
    FakeCenter mCenter;
    Support::TempDir mDirectory;
    const std::string mPath = mDirectory / "Database.sqlite3";
    const bool mUsesWriteAheadLog;
    std::string mFirstFile;
    std::vector<std::string> mStates;

    std::size_t mNextStep = 0;
    int mSavedStates = 0;
    bool mHasChanges = false;  ///< the first change has been made in memory
    std::vector<Foundation::Ref<Item>> mItems;
    Foundation::Ref<Group> mGroup;
};

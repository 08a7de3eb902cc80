#pragma once

#include "Model/Downloader.h"
#include "Model/DownloaderFactory.h"
#include "Model/EntryTest.h"

#include <stdexcept>
#include <string>

/// Makes downloaders that keep what they are told. It is the port of the process while it lives.
class FakeDownloaders : public Orvane::DownloaderFactory {
 public:
    class Fake : public Orvane::Downloader {
     public:
        explicit Fake(FakeDownloaders& owner) : mOwner(owner) {}
        void start() override { mOwner.calls += "start "; }
        void interrupt() override { mOwner.calls += "interrupt "; }
        long long getDownloadedBytes() const override { return mOwner.bytes; }

     private:
        FakeDownloaders& mOwner;
    };

    FakeDownloaders() { setCurrent(this); }
    ~FakeDownloaders() override { setCurrent(nullptr); }

    Foundation::Returner<Orvane::Downloader> makeDownloader(
        Orvane::EnclosureCore* enclosure) override {
        calls += OVFormat("make(%lli) ", enclosure->getRowID());
        if (isBroken) throw std::runtime_error("broken");
        return Foundation::Returner<Orvane::Downloader>::adopted(new Fake(*this));
    }

    std::string calls;
    long long bytes = 0;
    bool isBroken = false;
};

/// A test of enclosures, all of which are of one stored entry.
class EnclosureTest : public EntryTest {
 protected:
    Foundation::Ref<Orvane::EnclosureCore> stored(const char* location, const char* type = nullptr,
                                                  long long length = 0) {
        Foundation::Ref<Orvane::EnclosureCore> row = enclosure(location, type, length);
        entry->addToEnclosures(row.get());
        entry->saveChanges();
        return row;
    }

    const Foundation::Ref<Orvane::EntryCore> entry = storedEntry("abc");
};

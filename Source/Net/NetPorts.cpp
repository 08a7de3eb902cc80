#include "Net/NetPorts.h"

#include "Net/ReadAheadFileReader.h"

namespace Orvane {

NetPorts::NetPorts() {
    FeederFactory::setCurrent(&mFeeders);
    CredentialStore::setCurrent(&mCredentials);
    FileReader::setMaker([](Foundation::URL* url) -> std::unique_ptr<FileReader> {
        return std::make_unique<ReadAheadFileReader>(url, true);
    });
}

NetPorts::~NetPorts() {
    FeederFactory::setCurrent(nullptr);
    CredentialStore::setCurrent(nullptr);
    FileReader::setMaker(nullptr);
}

}  // namespace Orvane

#include "Model/FileReader.h"

#include "Foundation/Data.h"
#include "Model/MissingPort.h"

namespace Orvane {

namespace {

FileReader::Maker sMaker = nullptr;
constinit MissingPort sMissing{"FileReader"};

class NoReader : public FileReader {
 public:
    Foundation::DataReturner finish() override { return nullptr; }
};

}  // namespace

std::unique_ptr<FileReader> FileReader::open(Foundation::URL* url) {
    if (sMaker) return sMaker(url);
    sMissing.note();
    return std::make_unique<NoReader>();
}

void FileReader::setMaker(Maker maker) {
    sMaker = maker;
}

}  // namespace Orvane

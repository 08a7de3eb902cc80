#include "Model/FileReader.h"

#include "Foundation/Data.h"
#include "Foundation/NetError.h"
#include "Foundation/Ref.h"
#include "Foundation/URL.h"

namespace Orvane {

namespace {

FileReader::Maker sMaker = nullptr;

class LateReader : public FileReader {
 public:
    explicit LateReader(Foundation::URL* url) : mURL(url) {}
    Foundation::DataReturner finish() override { return Foundation::Data::dataFromResource(mURL); }

 private:
    const Foundation::Ref<Foundation::URL> mURL;
};

}  // namespace

std::unique_ptr<FileReader> FileReader::open(Foundation::URL* url) {
    return sMaker ? sMaker(url) : std::make_unique<LateReader>(url);
}

void FileReader::setMaker(Maker maker) {
    sMaker = maker;
}

}  // namespace Orvane

#include "Net/NetPorts.h"

#include "Model/FileReader.h"
#include "Net/FeederTest.h"

using namespace Foundation;
using namespace Orvane;

TEST_F(FeederTest, StandsBehindThePortsOfTheModel) {
    {
        const NetPorts ports;
        ASSERT_NE(FeederFactory::current(), nullptr);
        EXPECT_TRUE(FeederFactory::current()->supportsURL(url("https://a/")));
        EXPECT_FALSE(FeederFactory::current()->supportsURL(url("ftp://a/")));
        const Ref<FeedCore> free = freeFeed("http://a/");
        EXPECT_NE(dynamic_cast<PollingFeeder*>(free->getFeeder()), nullptr);
        free->removeFeeder();
        EXPECT_NE(CredentialStore::current(), nullptr);
        const std::string file = directory.writeFile("words", "words");
        const Ref<URL> place = URL::urlWithFileSystemPath(file.c_str(), false);
        const Ref<Data> bytes = FileReader::open(place)->finish();
        EXPECT_EQ(text(bytes.get()), "words");
    }
    EXPECT_EQ(FeederFactory::current(), nullptr);
    EXPECT_EQ(CredentialStore::current(), nullptr);
}

// What an application does first: opens its client, and writes the titles of its newest entries.

#include <Orvane/Orvane.h>

#include <cstdio>
#include <cstdlib>

int main(int argc, char** argv) {
    if (argc < 3) return 2;
    OVClient::setApplicationIdentifier(argv[1]);
    const std::shared_ptr<OVClient> client = OVClient::applicationClient();
    if (!client) return 1;
    OVEntryQuery query;
    query.limit = std::strtoul(argv[2], nullptr, 10);
    for (const std::shared_ptr<OVEntry>& entry : client->entries(query)) {
        std::printf("%s\n", entry->title().value_or("").c_str());
    }
    return 0;
}

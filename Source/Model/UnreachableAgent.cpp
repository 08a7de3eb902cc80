#include "Model/UnreachableAgent.h"

#include "Foundation/NetException.h"
#include "Model/MissingPort.h"

namespace Orvane {

using Foundation::NetError;

namespace {

constexpr NetError kError{NetError::kOrvane, OVAgentLaunchError};

void note() {
    static constinit MissingPort sMissing{"AgentLink"};
    sMissing.note();
}

[[noreturn]] void fail() {
    note();
    throw Foundation::NetException(kError);
}

}  // namespace

void UnreachableAgent::fixDatabase(int) {
    fail();
}

ClientCore* UnreachableAgent::createClient(String*) {
    fail();
}

void UnreachableAgent::markClientInUse(ClientCore*) {
    fail();
}

void UnreachableAgent::expireAllEntries(ClientCore*) {
    fail();
}

void UnreachableAgent::setPrivate(ClientCore*, bool) {
    fail();
}

SubscriptionCore* UnreachableAgent::createSubscription(ClientCore*, URL*, Dictionary*) {
    fail();
}

void UnreachableAgent::updateSubscription(SubscriptionCore*, double, double, bool, bool, double,
                                          Foundation::ArrayOf<String>*) {
    fail();
}

void UnreachableAgent::deleteSubscription(SubscriptionCore*) {
    fail();
}

NetError UnreachableAgent::refresh(FeedCore*, bool) {
    note();
    return kError;
}

void UnreachableAgent::refreshMultiple(const RowID*, unsigned, bool) {
    fail();
}

void UnreachableAgent::recoverOldEntries(FeedCore*) {
    fail();
}

void UnreachableAgent::setLogin(FeedCore*, String*) {
    fail();
}

void UnreachableAgent::setRead(EntryCore*, bool) {
    fail();
}

void UnreachableAgent::setFlagged(EntryCore*, bool) {
    fail();
}

void UnreachableAgent::setFlags(const RowID*, unsigned, int, int) {
    fail();
}

void UnreachableAgent::setContent(EntryCore*, const char*, ContentCore*) {
    fail();
}

void UnreachableAgent::setAuthor(EntryCore*, AuthorCore*) {
    fail();
}

AuthorCore* UnreachableAgent::createAuthor(String*, String*, URL*, String*) {
    fail();
}

void UnreachableAgent::setContactBookUID(AuthorCore*, String*) {
    fail();
}

bool UnreachableAgent::enclosureAction(EnclosureCore*, int) {
    note();
    return false;
}

}  // namespace Orvane

#include "Net/CookieStore.h"

#include "Foundation/Prefs.h"
#include "Foundation/UntypedPref.h"
#include "Net/CookieAcceptPolicyObserver.h"
#include "Net/HTTPCookieStorage.h"
#include "NetTest.h"
#include "Support/TempDir.h"

using namespace Orvane;

namespace {

using Lines = CookieStore::Lines;

/// A time in seconds since 1970 long after the clock's.
constexpr const char* kLater = "2000000000";

std::string cookie(const std::string& domain, const std::string& name, const std::string& value,
                   const std::string& expires = kLater) {
    const char* tail = domain.front() == '.' ? "TRUE" : "FALSE";
    return domain + "\t" + tail + "\t/\tFALSE\t" + expires + "\t" + name + "\t" + value;
}

class CookieStoreTest : public NetTest {
 protected:
    std::string path() const { return mDirectory / "Orvane/Cookies"; }
    Lines find(CookieStore& store, const char* address) { return store.findFor(*url(address)); }

    Support::TempDir mDirectory;
};

TEST_F(CookieStoreTest, GivesTheCookiesOfAHost) {
    CookieStore store("");
    store.update({}, {cookie("a.org", "x", "1"), cookie(".b.org", "y", "2"),
                      "#HttpOnly_" + cookie("c.org", "z", "3")});
    EXPECT_EQ(find(store, "http://A.org/"), Lines{cookie("a.org", "x", "1")});
    EXPECT_EQ(find(store, "http://www.a.org/"), Lines{});
    EXPECT_EQ(find(store, "http://b.org/"), Lines{cookie(".b.org", "y", "2")});
    EXPECT_EQ(find(store, "http://www.b.org/"), Lines{cookie(".b.org", "y", "2")});
    EXPECT_EQ(find(store, "http://notb.org/"), Lines{});
    EXPECT_EQ(find(store, "http://c.org/"), Lines{"#HttpOnly_" + cookie("c.org", "z", "3")});
}

TEST_F(CookieStoreTest, TakesOverWhatAnExchangeHasMadeOfThem) {
    CookieStore store("");
    const Lines before = {cookie("a", "x", "1"), cookie("a", "y", "1"), cookie("a", "z", "1")};
    store.update({}, before);
    // Another exchange has changed one in the meantime, which this one left alone.
    store.update({before[2]}, {cookie("a", "z", "2")});
    store.update(before, {before[0], cookie("a", "w", "1"), before[2]});
    EXPECT_EQ(find(store, "http://a/"),
              (Lines{cookie("a", "w", "1"), cookie("a", "x", "1"), cookie("a", "z", "2")}));
}

TEST_F(CookieStoreTest, KeepsThemInAFile) {
    {
        CookieStore store(path());
        store.update({}, {cookie("a", "x", "1"), cookie("a", "s", "1", "0")});
        EXPECT_FALSE(std::filesystem::exists(path()));
        turn();
        EXPECT_TRUE(std::filesystem::exists(path()));
        EXPECT_EQ(find(store, "http://a/").size(), 2u);
    }
    CookieStore store(path());
    EXPECT_EQ(find(store, "http://a/"), Lines{cookie("a", "x", "1")});
    const auto mode = std::filesystem::status(path()).permissions();
    EXPECT_EQ(mode, std::filesystem::perms::owner_read | std::filesystem::perms::owner_write);
}

TEST_F(CookieStoreTest, SavesWhatIsLeftWhenItEnds) {
    { CookieStore(path()).update({}, {cookie("a", "x", "1")}); }
    CookieStore store(path());
    EXPECT_EQ(find(store, "http://a/").size(), 1u);
}

TEST_F(CookieStoreTest, LeavesWhatAnotherProcessWroteInTheFile) {
    CookieStore one(path());
    CookieStore other(path());
    EXPECT_TRUE(find(one, "http://a/").empty());
    EXPECT_TRUE(find(other, "http://a/").empty());
    one.update({}, {cookie("a", "x", "1"), cookie("a", "y", "1")});
    turn();
    other.update({cookie("a", "y", "1")}, {cookie("a", "z", "1")});
    turn();
    const Lines all = {cookie("a", "x", "1"), cookie("a", "z", "1")};
    EXPECT_EQ(find(other, "http://a/"), all);
    CookieStore third(path());
    EXPECT_EQ(find(third, "http://a/"), all);
}

TEST_F(CookieStoreTest, ForgetsThemWhenTheirTimeIsOver) {
    CookieStore store(path());
    const double unixNow = mClock.now() + Foundation::kUnixEpochOffset;
    store.update({}, {cookie("a", "x", "1", OVFormat("%.0f", unixNow + 60))});
    EXPECT_EQ(find(store, "http://a/").size(), 1u);
    mClock.advanceBy(60);
    EXPECT_TRUE(find(store, "http://a/").empty());
    CookieStore other(path());
    EXPECT_TRUE(find(other, "http://a/").empty());
}

TEST_F(CookieStoreTest, ReadsNothingIntoWhatIsNoCookie) {
    mDirectory.makeDirectory("Orvane");
    mDirectory.writeFile("Orvane/Cookies", "# Netscape HTTP Cookie File\n\nx\ta\n" +
                                               cookie("a", "x", "1") + "\n" +
                                               cookie("a", "y", std::string(9000, 'x')) + "\n");
    CookieStore store(path());
    EXPECT_EQ(find(store, "http://a/"), Lines{cookie("a", "x", "1")});
}

TEST_F(CookieStoreTest, BoundsTheirNumber) {
    const Support::LogCapture log;
    CookieStore store("");
    Lines lines;
    for (std::size_t i = 0; i <= CookieStore::kMaxPerDomain; ++i) {
        lines.push_back(cookie("a", std::to_string(i), "1"));
    }
    store.update({}, lines);
    EXPECT_EQ(find(store, "http://a/").size(), CookieStore::kMaxPerDomain);
    EXPECT_EQ(log.count("a: too many cookies"), 1);
    // One that is there can be changed all the same.
    store.update({cookie("a", "0", "1")}, {cookie("a", "0", "2")});
    EXPECT_EQ(find(store, "http://a/").front(), cookie("a", "0", "2"));
}

TEST_F(CookieStoreTest, AcceptsByPolicy) {
    using enum CookieAcceptPolicy;
    EXPECT_TRUE(CookieStore::accepts(Always, "a.org", "b.org"));
    EXPECT_FALSE(CookieStore::accepts(Never, "a.org", "a.org"));
    EXPECT_TRUE(CookieStore::accepts(OnlyFromMainDocument, "a.org", "A.org"));
    EXPECT_TRUE(CookieStore::accepts(OnlyFromMainDocument, "www.a.org", "a.org"));
    EXPECT_TRUE(CookieStore::accepts(OnlyFromMainDocument, "a.org", "www.a.org"));
    EXPECT_FALSE(CookieStore::accepts(OnlyFromMainDocument, "ads.org", "a.org"));
    EXPECT_FALSE(CookieStore::accepts(OnlyFromMainDocument, "nota.org", "a.org"));
}

class CookiePolicyTest : public NetTest {
 protected:
    ~CookiePolicyTest() noexcept override { setPreference(nullptr); }

    static CookieStore& cookies() { return ConnectionService::shared().cookies(); }
    /// What the browser's setting says; null for nothing.
    void setPreference(const char* value) {
        Foundation::Prefs prefs("com.tarnwick.WebFoundation");
        Foundation::UntypedPref pref(prefs, "PNHTTPAcceptCookies");
        const Ref<Foundation::String> string = value ? text(value) : nullptr;
        pref = static_cast<Foundation::PFRefCounted*>(string.get());
        prefs.synchronize();
    }
    CookieAcceptPolicy policyFor(const char* value) {
        setPreference(value);
        HTTPCookieStorage::defaultStorage()->syncAcceptPolicyWithPreferences();
        EXPECT_EQ(cookies().getAcceptPolicy(),
                  HTTPCookieStorage::defaultStorage()->cookieAcceptPolicy());
        return cookies().getAcceptPolicy();
    }
    /// Asks for the first address, which redirects to the second, which sets a cookie.
    void fetch(const char* first, const char* second, const std::string& line) {
        network().answer(first, {.status = 302, .headers = {{"Location", second}}});
        network().answer(second, {.cookies = {line}});
        mRequest = get(first);
        mRequest->start(true);
        turn();
    }

    Ref<HTTPRequest> mRequest;
};

TEST_F(CookiePolicyTest, IsThatOfTheBrowser) {
    EXPECT_EQ(static_cast<int>(policyFor("always")), 0);
    EXPECT_EQ(static_cast<int>(policyFor("never")), 1);
    EXPECT_EQ(static_cast<int>(policyFor("current page")), 2);
    EXPECT_EQ(static_cast<int>(policyFor(nullptr)), 2);
}

TEST_F(CookiePolicyTest, FollowsTheBrowserWhileItRuns) {
    CookieAcceptPolicyObserver observer(HTTPCookieStorage::defaultStorage());
    EXPECT_EQ(mCenter.subscriptions.back(),
              "com.tarnwick.Foundation.PNHTTPCookieManagerAcceptPolicyChanged ");
    setPreference("never");
    mCenter.deliver("com.tarnwick.Foundation.PNHTTPCookieManagerAcceptPolicyChanged", "", nullptr);
    EXPECT_EQ(cookies().getAcceptPolicy(), CookieAcceptPolicy::Never);
}

TEST_F(CookiePolicyTest, SendsCookiesBack) {
    policyFor("always");
    fetch("http://a/", "http://a/x", cookie("a", "n", "v"));
    get("http://a/")->getURL();
    mRequest = get("http://a/");
    mRequest->start(true);
    turn();
    EXPECT_TRUE(network().requests().back().handlesCookies);
    EXPECT_EQ(network().requests().back().cookies, Lines{cookie("a", "n", "v")});
    mRequest->stop();
}

TEST_F(CookiePolicyTest, KeepsThoseOfOtherSitesOnlyWhereAllAreAccepted) {
    policyFor("always");
    fetch("http://a/", "http://b/", cookie("b", "n", "v"));
    EXPECT_EQ(cookies().findFor(*url("http://b/")).size(), 1u);
    policyFor(nullptr);
    fetch("http://a/", "http://c/", cookie("c", "n", "v"));
    EXPECT_TRUE(cookies().findFor(*url("http://c/")).empty());
    fetch("http://a/", "http://a/x", cookie("a", "n", "v"));
    EXPECT_EQ(cookies().findFor(*url("http://a/")).size(), 1u);
}

TEST_F(CookiePolicyTest, HandlesNoneWhereNoneIsAccepted) {
    policyFor("never");
    fetch("http://a/", "http://a/x", cookie("a", "n", "v"));
    EXPECT_FALSE(network().requests()[0].handlesCookies);
    EXPECT_TRUE(cookies().findFor(*url("http://a/")).empty());
}

TEST_F(CookiePolicyTest, HandlesNoneForAPlainRequest) {
    const Ref<URLRequest> request =
        Foundation::Returner<URLRequest>::adopted(new URLRequest(url("http://a/").get()));
    request->start(true);
    turn();
    EXPECT_FALSE(network().requests()[0].handlesCookies);
    request->stop();
}

}  // namespace

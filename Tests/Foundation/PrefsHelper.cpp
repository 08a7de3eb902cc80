// A program for tests of what processes see of each other's preferences, and of what the log makes
// of them. Its arguments are carried out one after the other:
//
//   set DOMAIN KEY TEXT     change a preference, and synchronize
//   remove DOMAIN KEY       remove it, and synchronize
//   get DOMAIN KEY          print its text, as of a synchronize
//   count DOMAIN KEY N      write N changes of KEY, each with a synchronize
//   as IDENTIFIER           be this application
//   on NAME                 print whether the log's facility will log; the empty name is the
//                           general log
//   assign NAME             change the switch NAME to true in the application's preferences

#include "Foundation/ApplicationIdentity.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Foundation/PreferenceFile.h"
#include "Foundation/UntypedPref.h"

#include <cstdio>
#include <cstdlib>
#include <map>
#include <string>

using namespace Foundation;

namespace {

/// The words of the command line that are still to be carried out.
class Words {
 public:
    explicit Words(char** words) : mNext(words) {}
    bool areLeft() const { return *mNext; }
    const char* next() { return *mNext ? *mNext++ : ""; }

 private:
    char** mNext;
};

void set(Prefs& prefs, const char* key, const char* text) {
    UntypedPref(prefs, key) = Ref<String>(String::string(text)).get();
    prefs.synchronize();
}

bool isSaved(Prefs& prefs, const char* key, const std::string& text) {
    const PreferenceFile file(PreferenceFile::pathOfDomain(prefs.getDomain()->view()));
    const PreferenceFile::Content content = file.read();
    const auto* value = content.values ? content.values->getAs<String>(key) : nullptr;
    return value && value->view() == text;
}

void count(Prefs& prefs, const char* key, int changes) {
    for (int i = 1; i <= changes; ++i) {
        set(prefs, key, std::to_string(i).c_str());
    }
    // Where many write to a slow disk, the wait for the lock may end before this one's turn comes.
    // The change is then kept for the next time.
    constexpr int kMostAttempts = 30;
    for (int i = 0; i < kMostAttempts && !isSaved(prefs, key, std::to_string(changes)); ++i) {
        prefs.synchronize();
    }
}

void print(Prefs& prefs, const char* key) {
    prefs.synchronize();
    const Ref<String> text = StringReturner(UntypedPref(prefs, key));
    std::printf("%s\n", text ? text->utf8().c_str() : "(null)");
}

Logger& facility(const std::string& name) {
    static std::map<std::string, Logger> sFacilities;
    if (name.empty()) return gLog;
    if (name == gLogPrefs.mName) return gLogPrefs;
    const auto found = sFacilities.try_emplace(name).first;
    found->second.mName = found->first.c_str();
    return found->second;
}

void changePreference(const std::string& command, Words& words) {
    Prefs prefs(words.next());
    const char* key = words.next();
    if (command == "set") set(prefs, key, words.next());
    if (command == "count") count(prefs, key, std::atoi(words.next()));
    if (command == "get") print(prefs, key);
    if (command == "remove") {
        UntypedPref(prefs, key) = nullptr;
        prefs.synchronize();
    }
}

void carryOut(const std::string& command, Words& words) {
    if (command == "as") {
        ApplicationIdentity::setIdentifier(words.next());
    } else if (command == "on") {
        std::printf("%d\n", facility(words.next()).willLog());
    } else if (command == "assign") {
        UntypedPref(Prefs::applicationPrefs(), words.next()) = true;
    } else {
        changePreference(command, words);
    }
}

}  // namespace

int main(int, char** argv) {
    const AutoreleasePool pool;
    Words words(argv + 1);
    while (words.areLeft()) {
        carryOut(words.next(), words);
    }
    return 0;
}

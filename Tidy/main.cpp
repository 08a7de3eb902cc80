#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/TidyService.h"
#include "Foundation/Guard.h"
#include "Foundation/ProcessBeginning.h"

/// Tidies for the process that started it, with which it shares a socket.
int main() {
    int status = 1;
    Foundation::callGuarded("int main()", [&status] {
        Orvane::FeedParser::TidyService service(Foundation::ProcessBeginning::kGiven);
        service.boundProcess();
        status = service.run(Orvane::FeedParser::Bounds::kTidyIdleSeconds);
    });
    return status;
}

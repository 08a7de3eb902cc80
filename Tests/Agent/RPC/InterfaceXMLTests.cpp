#include "Agent/RPC/InterfaceXML.h"

#include "Agent/RPC/Routines.h"

#include <gtest/gtest.h>

#include <fstream>
#include <sstream>

using namespace Orvane;

TEST(InterfaceXML, IsWhatIsInstalled) {
    std::ifstream file(INTERFACE_FILE);
    std::stringstream text;
    text << file.rdbuf();
    EXPECT_EQ(text.str(), RPC::describeForFile());
}

TEST(InterfaceXML, HasAMethodWithNumberAndTypesForEachRoutine) {
    const std::string text = RPC::describeInterface();
    for (const RPC::Routine* routine : RPC::allRoutines()) {
        const std::string head = "<method name=\"" + std::string(routine->name) +
                                 "\">\n      <annotation name=\"" +
                                 "com.tarnwick.orvane.ipc.RoutineNumber\" value=\"" +
                                 std::to_string(routine->number) + "\"/>\n";
        EXPECT_NE(text.find(head), std::string::npos) << routine->name;
    }
    EXPECT_NE(text.find("    <method name=\"feed_refresh\">\n"
                        "      <annotation name=\"com.tarnwick.orvane.ipc.RoutineNumber\" "
                        "value=\"109\"/>\n"
                        "      <arg name=\"feed\" type=\"x\" direction=\"in\"/>\n"
                        "      <arg name=\"arg\" type=\"b\" direction=\"in\"/>\n"
                        "      <arg name=\"status\" type=\"i\" direction=\"out\"/>\n"
                        "      <arg name=\"domain\" type=\"x\" direction=\"out\"/>\n"
                        "    </method>\n"),
              std::string::npos);
}

TEST(InterfaceXML, DescribesAnObjectThatCanBeIntrospected) {
    const std::string text = RPC::describeObject();
    EXPECT_NE(text.find(RPC::describeInterface()), std::string::npos);
    EXPECT_NE(text.find("<interface name=\"org.freedesktop.DBus.Introspectable\">"),
              std::string::npos);
}

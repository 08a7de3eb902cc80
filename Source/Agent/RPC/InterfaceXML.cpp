#include "Agent/RPC/InterfaceXML.h"

#include "Agent/RPC/AgentService.h"
#include "Agent/RPC/Routines.h"

namespace Orvane::RPC {

namespace {

constexpr const char* kDocumentType =
    "<!DOCTYPE node PUBLIC \"-//freedesktop//DTD D-BUS Object Introspection 1.0//EN\"\n"
    " \"http://www.freedesktop.org/standards/dbus/1.0/introspect.dtd\">\n";

constexpr const char* kIntrospectable =
    "  <interface name=\"org.freedesktop.DBus.Introspectable\">\n"
    "    <method name=\"Introspect\">\n"
    "      <arg name=\"xml_data\" type=\"s\" direction=\"out\"/>\n"
    "    </method>\n"
    "  </interface>\n";

std::string element(const char* name, const char* form, const char* direction) {
    return OVFormat("      <arg name=\"%s\" type=\"%s\" direction=\"%s\"/>\n", name, form,
                    direction);
}

std::string describe(const Routine& routine) {
    std::string text = OVFormat("    <method name=\"%s\">\n", routine.name);
    text += OVFormat("      <annotation name=\"%s\" value=\"%d\"/>\n", kNumberAnnotation,
                     routine.number);
    for (const Parameter& argument : routine.arguments) {
        if (argument.name) text += element(argument.name, argument.form, "in");
    }
    text += element("status", "i", "out");
    for (const Parameter& result : routine.results) {
        if (result.name) text += element(result.name, result.form, "out");
    }
    return text + "    </method>\n";
}

}  // namespace

std::string describeInterface() {
    std::string text = OVFormat("  <interface name=\"%s\">\n", kInterface);
    for (const Routine* routine : allRoutines()) {
        text += describe(*routine);
    }
    return text + "  </interface>\n";
}

std::string describeObject() {
    return kDocumentType + ("<node>\n" + describeInterface()) + kIntrospectable + "</node>\n";
}

std::string describeForFile() {
    return kDocumentType + ("<node>\n" + describeInterface()) + "</node>\n";
}

}  // namespace Orvane::RPC

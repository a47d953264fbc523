// qltypes: what is in a table of data types, and why is it there?
//
// Results go to standard output, complaints to standard error. Ends with 0, with 1 where a loss or a difference was
// found, or with 2 for bad input or a bad call.
#include <cstdio>
#include <exception>
#include <new>

#include "Commands.h"
#include "qltypes/host/Version.h"

namespace {

constexpr int differenceFound = 1;
constexpr int badInput = 2;

int complain(const char* text) {
    std::fprintf(stderr, "%s\n", text);
    return badInput;
}

} // namespace

int main(int argc, char** argv) {
    inspector::CommandLine line("qltypes", QLTypeSys::libraryVersion(),
                                "Shows what is in a table of data types, and why it is there.",
                                "Help on a subcommand: qltypes SUBCOMMAND --help");
    inspector::addLayoutCommand(line);
    inspector::addTypeCommand(line);
    inspector::addConvertCommand(line);
    inspector::addDimsCommand(line);
    inspector::addTimeCommand(line);
    inspector::addTableCommand(line);
    inspector::addMessagesCommand(line);
    inspector::addFlagsCommand(line);
    try {
        return line.run(argc, argv) ? 0 : badInput;
    } catch (const inspector::DifferenceFound&) {
        return differenceFound;
    } catch (const std::bad_alloc&) {
        return complain("qltypes: out of memory");
    } catch (const inspector::UsageError& e) {
        return complain((std::string("qltypes: ") + e.what()).c_str());
    } catch (const std::exception& e) {
        return complain(e.what());
    }
}

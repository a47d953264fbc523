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
    CLI::App app("Shows what is in a table of data types, and why it is there.", "qltypes");
    app.set_version_flag("--version", std::string("qltypes ") + QLTypeSys::libraryVersion());
    app.require_subcommand(1);
    app.footer("Help on a subcommand: qltypes SUBCOMMAND --help");
    inspector::addLayoutCommand(app);
    inspector::addTypeCommand(app);
    inspector::addConvertCommand(app);
    inspector::addDimsCommand(app);
    inspector::addTimeCommand(app);
    inspector::addTableCommand(app);
    inspector::addMessagesCommand(app);
    inspector::addFlagsCommand(app);
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        return app.exit(e) == 0 ? 0 : badInput; // help and version are no failures
    } catch (const inspector::DifferenceFound&) {
        return differenceFound;
    } catch (const std::bad_alloc&) {
        return complain("qltypes: out of memory");
    } catch (const inspector::UsageError& e) {
        return complain((std::string("qltypes: ") + e.what()).c_str());
    } catch (const std::exception& e) {
        return complain(e.what());
    }
    return 0;
}

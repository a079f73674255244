// glimmer-render: the library from the command line. Parses the request,
// renders it (or the gallery), writes the PNG and prints what a caller of the
// library would learn: the bitmap size, the four margins and the effect key.

#include <cstdio>
#include <exception>
#include <new>
#include <string>
#include <vector>

#include "Gallery.h"
#include "Options.h"
#include "Png.h"
#include "Renderer.h"
#include "Values.h"
#include "glimmer/glimmer.h"

namespace {

using namespace Glimmer::RenderTool;

int Run(const std::vector<std::string>& args) {
    const Command command = ParseCommandLine(args);
    switch (command.mode) {
        case Command::Mode::kHelp:
            std::fputs(HelpText().c_str(), stdout);
            return 0;
        case Command::Mode::kVersion:
            std::printf("glimmer-render %s\n", glimmer::versionString());
            return 0;
        case Command::Mode::kGallery: {
            const std::string output = command.output.empty() ? "gallery.png" : command.output;
            const Image sheet =
                RenderGallery(command.textGiven ? command.request.text : "", command.request.fontPath);
            WritePng(output, sheet);
            std::printf("gallery %dx%d, %zu cells\nwrote %s\n", sheet.width, sheet.height, GalleryCells().size(),
                        output.c_str());
            return 0;
        }
        case Command::Mode::kRender:
            break;
    }
    const std::string output = command.output.empty() ? "glimmer.png" : command.output;
    const RenderResult result = Render(command.request);
    WritePng(output, result.image);
    std::printf("bitmap %dx%d\n", result.image.width, result.image.height);
    std::printf("margins left=%d top=%d right=%d bottom=%d\n", result.left, result.top, result.right,
                result.bottom);
    std::printf("key %s\n", result.key.c_str());
    std::printf("wrote %s\n", output.c_str());
    return 0;
}

int Fail(const char* message, int status) {
    std::fprintf(stderr, "glimmer-render: %s\n", message);
    return status;
}

}  // namespace

#if defined(__SANITIZE_ADDRESS__)
// fontconfig 2.14 loses a few hundred bytes inside FcInit, once per process;
// sanitizer builds should neither fail on it nor add to the one-line errors.
extern "C" const char* __lsan_default_suppressions() { return "leak:libfontconfig.so\n"; }
extern "C" const char* __lsan_default_options() { return "print_suppressions=0"; }
#endif

int main(int argc, char** argv) {
    std::vector<std::string> args(argv + 1, argv + argc);
    try {
        return Run(args);
    } catch (const UsageError& e) {
        return Fail(e.what(), 2);
    } catch (const RenderError& e) {
        return Fail(e.what(), 1);
    } catch (const std::bad_alloc&) {
        return Fail("out of memory", 1);
    } catch (const std::exception& e) {
        return Fail(e.what(), 1);
    }
}

// The renderer's request parsing: a JSON options file, a command line, or one
// effect spec (-e), then the parsed effects turned into the public API's
// effect values. Malformed requests must end in the renderer's own usage or
// render errors, never a crash or an error of another kind. Nothing is
// rendered (the effect stack has its own target); the first byte picks the
// form, the rest is its text (command-line arguments split at NUL bytes).

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "Effects.h"
#include "Options.h"
#include "Values.h"

using namespace Glimmer::RenderTool;

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    if (size == 0) return 0;
    const std::string_view text(reinterpret_cast<const char*>(data + 1), size - 1);
    try {
        Command command;
        switch (data[0] % 3) {
            case 0:
                // Relative tile paths resolve into a folder that does not exist.
                ReadJsonText(text, "/nonexistent/fuzz.json", &command);
                break;
            case 1: {
                std::vector<std::string> args;
                size_t from = 0;
                for (;;) {
                    const size_t nul = text.find('\0', from);
                    args.emplace_back(text.substr(from, nul == std::string_view::npos ? std::string_view::npos
                                                                                      : nul - from));
                    if (nul == std::string_view::npos) break;
                    from = nul + 1;
                }
                command = ParseCommandLine(args);
                break;
            }
            default:
                command.request.effects.push_back(ParseEffect(text));
                break;
        }
        glimmer::Text out;
        for (const EffectRequest& effect : command.request.effects) AddEffect(effect, &out);
    } catch (const UsageError&) {
    } catch (const RenderError&) {
    }
    return 0;
}

// The picture table: renders every case of pictures.tsv through the renderer's
// request parser and the public render call, and compares a hash of the bitmap
// size, its margins, its pixels and where each line landed with the recorded one
// (mode "gallery": the renderer's contact sheet of the text). The same table runs in every
// build, so x86-64 and 64-bit Arm are held to the same pixels.
//
//   picture_tests TABLE RENDERER           check; prints the first differing case
//   GLIMMER_RECORD_PICTURES=1 picture_tests TABLE RENDERER   rewrite the hashes
//
// Relative file names (fonts, tiles) are taken from the table's folder. Fonts are
// checked by size and hash first: a different font file would change every
// picture drawn with it, and the message should say so rather than blame the
// engine.

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <fstream>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include "Gallery.h"
#include "Options.h"
#include "Renderer.h"

namespace {

using namespace Glimmer::RenderTool;

struct Hash {
    uint64_t h = 0xcbf29ce484222325u;   // FNV-1a, 64 bits
    void Add(const void* data, size_t size) {
        for (size_t i = 0; i < size; ++i) h = (h ^ static_cast<const unsigned char*>(data)[i]) * 0x100000001b3u;
    }
    void Add(int32_t v) { Add(&v, sizeof v); }
    std::string Hex() const {
        char text[17];
        std::snprintf(text, sizeof text, "%016llx", static_cast<unsigned long long>(h));
        return text;
    }
};

std::vector<std::string> Split(const std::string& line, char by) {
    std::vector<std::string> fields;
    std::string field;
    std::istringstream in(line);
    while (std::getline(in, field, by)) {
        if (!field.empty() || by == '\t') fields.push_back(field);
    }
    return fields;
}

std::string Shell(const std::string& s) {
    if (s.find_first_not_of("abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789-_=:,./@") ==
        std::string::npos)
        return s;
    std::string out = "'";
    for (char c : s) out += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return out + "'";
}

struct Font {
    std::string path;
    size_t size = 0;
    std::string hash;
};

// The file's size and hash; size 0 when it cannot be read.
Font Measure(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    const std::string bytes{std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
    Hash hash;
    hash.Add(bytes.data(), bytes.size());
    return {path, in ? bytes.size() : 0, hash.Hex()};
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 3) {
        std::fprintf(stderr, "usage: %s TABLE RENDERER\n", argv[0]);
        return 2;
    }
    const std::string table = argv[1], renderer = argv[2];
    const std::string folder = table.substr(0, table.rfind('/') + 1);
    const bool record = std::getenv("GLIMMER_RECORD_PICTURES") != nullptr;

    std::ifstream in(table);
    if (!in) {
        std::fprintf(stderr, "%s: cannot be read\n", table.c_str());
        return 2;
    }
    std::vector<std::string> lines;
    for (std::string line; std::getline(in, line);) lines.push_back(line);

    std::map<std::string, Font> fonts;
    std::map<std::string, std::string> badFonts;   // name -> why
    int passed = 0, failed = 0;
    for (size_t n = 0; n < lines.size(); ++n) {
        std::string& line = lines[n];
        if (line.empty() || line[0] == '#') continue;
        std::vector<std::string> f = Split(line, '\t');
        const std::string where = table + ":" + std::to_string(n + 1) + ": ";
        if (f[0] == "font" && f.size() == 5) {
            // font NAME PATH BYTES HASH
            const std::string path = f[2][0] == '/' ? f[2] : folder + f[2];
            const Font found = Measure(path);
            fonts[f[1]] = found;
            if (record) {
                line = "font\t" + f[1] + "\t" + f[2] + "\t" + std::to_string(found.size) + "\t" + found.hash;
            } else if (found.size == 0) {
                badFonts[f[1]] = "font " + f[1] + ": " + path + " cannot be read (run scripts/setup.sh)";
            } else if (std::to_string(found.size) != f[3] || found.hash != f[4]) {
                badFonts[f[1]] = "font " + f[1] + ": " + path + " is not the recorded file (" +
                                 std::to_string(found.size) + " bytes, hash " + found.hash + "; recorded " + f[3] +
                                 " bytes, " + f[4] + "): its pictures cannot be compared; re-record the table";
            }
            continue;
        }
        // NAME TEXT FONT SIZE MODE OPTIONS HASH
        const bool gallery = f.size() == 7 && f[4] == "gallery";
        if (f.size() != 7 || !fonts.count(f[2]) || (f[4] != "style" && f[4] != "exact" && !gallery)) {
            std::fprintf(stderr, "%smalformed case (name, text, font, size, mode, options, hash by tabs)\n",
                         where.c_str());
            return 2;
        }
        std::vector<std::string> args = {f[1], "--font", fonts[f[2]].path, "--size", f[3]};
        if (f[4] != "style") args.push_back("--" + f[4]);
        for (std::string option : Split(f[5], ' ')) {
            // Tiles lie beside the table, wherever the program runs from.
            const size_t tile = option.find("tile=");
            if (tile != std::string::npos && option[tile + 5] != '/') {
                option = option.substr(0, tile + 5) + folder + option.substr(tile + 5);
            }
            args.push_back(option);
        }

        std::string command = renderer;
        for (const std::string& arg : args) command.append(" ").append(Shell(arg));
        command.append(" -o ").append(f[0]).append(".png");

        std::string got;
        try {
            RenderResult r;
            if (gallery) {
                r.image = RenderGallery(f[1], fonts[f[2]].path);
            } else {
                r = Render(ParseCommandLine(args).request);
            }
            Hash hash;
            for (int v : {r.image.width, r.image.height, r.left, r.top, r.right, r.bottom}) hash.Add(v);
            hash.Add(r.image.pixels.data(), r.image.pixels.size() * sizeof(uint32_t));
            for (const glimmer::Line& l : r.lines) {
                for (int v : {int(l.begin), int(l.end), l.x, l.baseline, l.width, l.top, l.bottom}) hash.Add(v);
            }
            got = hash.Hex();
        } catch (const std::exception& e) {
            got = std::string("error: ") + e.what();
        }
        if (record) {
            f[6] = got;
            line = f[0];
            for (size_t i = 1; i < f.size(); ++i) line += "\t" + f[i];
        } else if (got == f[6]) {
            ++passed;
        } else {
            if (failed++ == 0) {
                const auto bad = badFonts.find(f[2]);
                if (got.rfind("error: ", 0) == 0) {
                    std::printf("%scase '%s' no longer renders: %s\n", where.c_str(), f[0].c_str(), got.c_str() + 7);
                } else {
                    std::printf("%scase '%s' renders other pixels than recorded (hash %s, recorded %s)\n",
                                where.c_str(), f[0].c_str(), got.c_str(), f[6].c_str());
                }
                if (bad != badFonts.end()) std::printf("  %s\n", bad->second.c_str());
                std::printf("  see it: %s\n", command.c_str());
            }
        }
    }
    if (record) {
        std::ofstream out(table, std::ios::trunc);
        for (const std::string& line : lines) out << line << '\n';
        std::printf("recorded %s\n", table.c_str());
        return out ? 0 : 1;
    }
    for (const auto& [name, why] : badFonts) std::printf("%s\n", why.c_str());
    std::printf("pictures: %d passed, %d failed\n", passed, failed);
    return failed == 0 ? 0 : 1;
}

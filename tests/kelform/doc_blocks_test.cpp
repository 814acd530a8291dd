// The code blocks of README.md and docs/ that are meant to run: ```kfs blocks are played as
// scripts from the repository's root, ```kform blocks opened as form files. Set-up, whole-suite
// and interactive commands are left unmarked, so that the docs cannot drift from what runs.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>

#include "apps/kelform/form_file.h"
#include "apps/kelform/play.h"
#include "keltext/library/catalogue.h"

namespace kel::kelform {
namespace {

namespace fs = std::filesystem;
const fs::path kSourceRoot = fs::path(__FILE__).parent_path().parent_path().parent_path();

struct Block {
    std::string file;
    int line = 0;
    std::string kind;
    std::string text;
};

std::vector<Block> marked_blocks() {
    std::vector<fs::path> files{kSourceRoot / "README.md"};
    for (const auto& e : fs::directory_iterator(kSourceRoot / "docs"))
        if (e.path().extension() == ".md") files.push_back(e.path());
    std::vector<Block> out;
    for (const fs::path& f : files) {
        std::ifstream in(f);
        std::string line;
        std::optional<Block> open;
        for (int n = 1; std::getline(in, line); ++n) {
            if (!line.starts_with("```")) {
                if (open) open->text += line + "\n";
            } else if (open) {
                out.push_back(std::move(*open));
                open.reset();
            } else if (const std::string kind = line.substr(3); kind == "kfs" || kind == "kform") {
                open = Block{f.filename().string(), n, kind, {}};
            } else {
                open = Block{f.filename().string(), n, "", {}};  // unmarked: skipped
            }
        }
    }
    std::erase_if(out, [](const Block& b) { return b.kind.empty(); });
    return out;
}

TEST(DocBlocks, EveryMarkedBlockRuns) {
    const auto blocks = marked_blocks();
    EXPECT_GE(blocks.size(), 3u);  // the README's script, and the form file and script of docs/
    Catalogue catalogue;
    const fs::path here = fs::current_path();
    fs::current_path(kSourceRoot);
    for (const Block& b : blocks) {
        SCOPED_TRACE(b.file + ":" + std::to_string(b.line));
        if (b.kind == "kfs") {
            std::istringstream in(b.text);
            std::ostringstream out, err;
            const std::string_view stdin_script[] = {"-"};
            EXPECT_EQ(play(stdin_script, catalogue.classes(), in, out, err,
                           [&catalogue](Player& p) { add_form_commands(p, catalogue.classes()); }),
                      0)
                << out.str() << err.str();
        } else {
            try {
                const SavedForm saved = parse_form(b.text, b.file, catalogue.classes());
                mini::Form form;
                open_form(form, saved, catalogue.classes(), b.file, make_date(2026, 12, 6).value());
            } catch (const FormFileError& e) {
                ADD_FAILURE() << e.what();
            }
        }
    }
    fs::current_path(here);
}

}  // namespace
}  // namespace kel::kelform

// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "fuzz/support/place.h"

#include <cstdlib>
#include <fstream>
#include <stdexcept>

#include "board/board.h"

namespace fuzz
{
namespace
{

struct Directory
{
    Directory()
    {
        std::string name = (std::filesystem::temp_directory_path() / "pmx-fuzz-XXXXXX").string();
        if (mkdtemp(name.data()) == nullptr)
            throw std::runtime_error("cannot make " + name);
        path = name;
    }
    ~Directory()
    {
        std::error_code ignored;
        std::filesystem::remove_all(path, ignored);
    }
    Directory(const Directory&) = delete;
    Directory& operator=(const Directory&) = delete;

    std::filesystem::path path;
};

} // namespace

const std::filesystem::path& project()
{
    static const std::filesystem::path directory = [] {
        const auto beside = std::filesystem::read_symlink("/proc/self/exe").replace_filename("pmx");
        const std::filesystem::path found = std::filesystem::exists(beside) ? beside : PMX_SOURCE_DIR;
        board::set_boards_directory(found / "boards");
        return found;
    }();
    return directory;
}

void power_on()
{
    board::power_on(board::load_description(project() / "boards" / "default"));
}

const std::filesystem::path& place()
{
    static const Directory directory;
    return directory.path;
}

std::string file_with(std::string_view bytes, std::string_view name)
{
    const std::string file = (place() / name).string();
    std::ofstream out(file, std::ios::binary | std::ios::trunc);
    out << bytes;
    if (!out.flush())
        throw std::runtime_error("cannot write " + file);
    return file;
}

} // namespace fuzz

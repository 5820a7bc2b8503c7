// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/boards_directory.h"

#include <optional>

#include "board/installed_header.h"

namespace board
{
namespace
{

namespace fs = std::filesystem;

constexpr const char* below_prefix = "share/pmx/boards";

std::optional<fs::path> boards_below(const fs::path& prefix)
{
    std::error_code none;
    const fs::path boards = fs::canonical(prefix / below_prefix, none);
    return !none && fs::is_directory(boards, none) ? std::optional(boards) : std::nullopt;
}

} // namespace

fs::path found_boards_directory()
{
    if (board_installed_header != nullptr) // PREFIX/include/pmx/board/…
    {
        if (const auto boards = boards_below(fs::path(board_installed_header).parent_path() / "../../.."))
            return *boards;
    }
    std::error_code none;
    const fs::path beside = fs::read_symlink("/proc/self/exe", none).parent_path();
    for (fs::path above = beside; above.has_relative_path(); above = above.parent_path())
    {
        if (const auto boards = boards_below(above))
            return *boards;
    }
    return beside / below_prefix;
}

} // namespace board

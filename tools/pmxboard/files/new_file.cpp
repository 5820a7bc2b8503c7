// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/files/new_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <streambuf>

#include "board/files.h"
#include "tools/pmxboard/files/ending.h"

namespace pmxboard
{

using board::files::FileError;

namespace
{

/** Beside what it is to become, under its name. Of a name that leaves no room for more, the end is left out. */
std::string unfinished_beside(const std::filesystem::path& target, const std::string& directory)
{
    constexpr std::string_view ending = ".unfinished-XXXXXX";
    std::string name = target.filename().string();
    const long limit = pathconf(directory.c_str(), _PC_NAME_MAX);
    const std::size_t longest = limit < 0 ? NAME_MAX : static_cast<std::size_t>(limit);
    if (name.size() <= longest && name.size() + ending.size() > longest)
    {
        std::size_t size = longest - ending.size();
        while (size > 0 && (static_cast<unsigned char>(name[size]) & 0xC0) == 0x80) // in the middle of a character
            --size;
        name.resize(size);
    }
    return std::filesystem::path(target).replace_filename(name.append(ending)).string();
}

} // namespace

/** Writes to a file and remembers the first failure. */
class NewFile::Buffer : public std::streambuf
{
public:
    explicit Buffer(int file) : m_file(file) { setp(m_part, m_part + sizeof m_part); }
    ~Buffer() override { close(m_file); }
    Buffer(const Buffer&) = delete;
    Buffer& operator=(const Buffer&) = delete;

    int file() const { return m_file; }
    int error() const { return m_error; }

protected:
    int_type overflow(int_type c) override
    {
        if (sync() != 0)
            return traits_type::eof();
        if (!traits_type::eq_int_type(c, traits_type::eof()))
            sputc(traits_type::to_char_type(c));
        return traits_type::not_eof(c);
    }

    int sync() override
    {
        for (const char* from = pbase(); from != pptr() && m_error == 0;)
        {
            const ssize_t written = write(m_file, from, static_cast<std::size_t>(pptr() - from));
            if (written >= 0)
                from += written;
            else if (errno != EINTR)
                m_error = errno;
        }
        setp(m_part, m_part + sizeof m_part);
        return m_error == 0 ? 0 : -1;
    }

private:
    int m_file;
    int m_error = 0;
    char m_part[65536];
};

NewFile::NewFile(const std::string& name, Over over, Unfinished unfinished) : m_name(name), m_over(over), m_target(name)
{
    struct stat status
    {
    };
    const bool exists = stat(name.c_str(), &status) == 0;
    if (exists && S_ISDIR(status.st_mode))
        failed(EISDIR);
    if (exists && !S_ISREG(status.st_mode))
    {
        const int file = open(name.c_str(), O_WRONLY | O_CLOEXEC | O_NOCTTY);
        if (file < 0)
            failed(errno);
        m_buffer = std::make_unique<Buffer>(file);
    }
    else
    {
        refuse_input();
        // What may not be written is not replaced either.
        if (exists && access(name.c_str(), W_OK) != 0)
            failed(errno);
        create_beside(unfinished);
        if (exists)
            fchmod(m_buffer->file(), status.st_mode & 07777u);
    }
    m_stream = std::make_unique<std::ostream>(m_buffer.get());
}

NewFile::~NewFile()
{
    if (m_temporary.empty())
        return;
    unlink(m_temporary.c_str());
    forget_temporary(m_temporary.c_str());
}

std::ostream& NewFile::stream()
{
    return *m_stream;
}

void NewFile::commit()
{
    m_stream->flush();
    if (m_buffer->error() != 0)
        failed(m_buffer->error());
    if (m_temporary.empty())
        return;
    refuse_input(); // it may have become one meanwhile
    if (fsync(m_buffer->file()) != 0 && errno != EINVAL && errno != EROFS)
        failed(errno);
    if (rename(m_temporary.c_str(), m_target.c_str()) != 0)
        failed(errno);
    forget_temporary(m_temporary.c_str());
    m_temporary.clear();
}

void NewFile::refuse_input() const
{
    board::files::note_input("/proc/self/exe"); // its symbols are looked up while it runs
    if (m_over == Over::OutputsAlone && board::files::is_input(m_target))
        throw FileError("cannot write " + m_name + ": this run reads it");
}

/** A file beside the one that it is to become, for only within a directory a name passes on at once. */
void NewFile::create_beside(Unfinished unfinished)
{
    std::error_code error;
    const std::filesystem::path real = std::filesystem::weakly_canonical(m_name, error);
    if (error)
        failed(error.value());
    const std::filesystem::path given(m_name);
    // A link to nothing yet, or a plain name.
    m_target = std::filesystem::is_symlink(given, error) ? real.string() : m_name;
    const std::filesystem::path parent = std::filesystem::path(m_target).parent_path();
    const std::string directory = parent.empty() ? "." : parent.string();
    const bool is_kept = unfinished == Unfinished::Kept;
    std::string temporary = is_kept ? unfinished_beside(m_target, directory) : directory + "/.pmxboard-XXXXXX";
    const InterruptsWait wait;
    const int file = mkostemp(temporary.data(), O_CLOEXEC);
    if (file < 0)
        failed(errno);
    const mode_t mask = umask(0);
    umask(mask);
    fchmod(file, 0666u & ~mask);
    m_buffer = std::make_unique<Buffer>(file);
    m_temporary = std::move(temporary);
    const auto write_rest = [](void* buffer) { static_cast<Buffer*>(buffer)->pubsync(); };
    remember_temporary(m_temporary.c_str(), is_kept ? +write_rest : nullptr, m_buffer.get());
}

void NewFile::failed(int error) const
{
    throw FileError("cannot write " + m_name + ": " + std::strerror(error));
}

void write_file(const std::string& name, std::string_view text)
{
    NewFile file(name);
    file.stream() << text;
    file.commit();
}

} // namespace pmxboard

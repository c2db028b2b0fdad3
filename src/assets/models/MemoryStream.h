#pragma once

#include <istream>
#include <streambuf>
#include <string_view>

/// Bytes in memory as the buffer of an input stream.
class MemoryBuffer : public std::streambuf
{
public:
    explicit MemoryBuffer(std::string_view bytes)
    {
        char* begin = const_cast<char*>(bytes.data()); // an input buffer never writes, its interface just isn't const
        setg(begin, begin, begin + bytes.size());
    }

protected:
    pos_type seekoff(off_type offset, std::ios_base::seekdir from, std::ios_base::openmode) override
    {
        const off_type size = egptr() - eback();
        const off_type start = from == std::ios_base::beg ? 0 : from == std::ios_base::cur ? gptr() - eback() : size;
        if (start + offset < 0 || start + offset > size)
            return pos_type(off_type(-1));
        setg(eback(), eback() + start + offset, egptr());
        return pos_type(start + offset);
    }

    pos_type seekpos(pos_type position, std::ios_base::openmode mode) override
    {
        return seekoff(off_type(position), std::ios_base::beg, mode);
    }
};

/// Reads bytes that lie in memory, without a copy; they must outlive it.
class MemoryStream : private MemoryBuffer, public std::istream
{
public:
    explicit MemoryStream(std::string_view bytes) : MemoryBuffer(bytes), std::istream(static_cast<MemoryBuffer*>(this))
    {
    }
};

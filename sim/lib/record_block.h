// The library's read calls hand out linked lists of fixed-size records whose text
// fields are as large as the largest text (a share record is 4 KiB). A list is one
// anonymous mapping that holds all its records: no allocation per record, and its
// pages are made present when it is mapped, in one system call, not by one page fault
// each as the texts are copied (200 shares are 200 pages). They come zeroed, so every
// byte a reader can reach is defined even where the texts leave a field unwritten.
#pragma once

#include <sys/mman.h>

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <memory>
#include <span>
#include <string_view>

class RecordBlock {
public:
    RecordBlock() = default;
    RecordBlock(const RecordBlock&) = delete;
    RecordBlock& operator=(const RecordBlock&) = delete;
    ~RecordBlock() { release(); }

    // `count` records, each linked to the next through `next` and the last to none,
    // in place of the block's previous records. Empty when `count` is 0 or when there
    // is no memory for them.
    template <typename Record>
    std::span<Record> hold(std::size_t count)
    {
        release();
        if (count == 0)
            return {};
        const std::size_t size = count * sizeof(Record);
        void* start = mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS | MAP_POPULATE, -1, 0);
        if (start == MAP_FAILED)
            return {};
        start_ = start;
        size_ = size;
        const std::span<Record> records(static_cast<Record*>(start), count);
        std::uninitialized_default_construct(records.begin(), records.end());
        for (std::size_t i = 0; i + 1 < count; ++i)
            records[i].next = &records[i + 1];
        records.back().next = nullptr;
        return records;
    }

    void release()
    {
        if (start_ != nullptr)
            munmap(start_, size_);
        start_ = nullptr;
        size_ = 0;
    }

private:
    void* start_ = nullptr;
    std::size_t size_ = 0;
};

// Copies the text up to its first NUL, at most size-1 bytes, into a text field of
// `size` bytes and ends it there, as the library's fixed fields hold their texts.
template <std::size_t size>
void copy_text_field(char (&field)[size], std::string_view text)
{
    const std::size_t length = std::min(text.substr(0, text.find('\0')).size(), size - 1);
    std::memcpy(field, text.data(), length);
    field[length] = '\0';
}

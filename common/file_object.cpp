#include <file/file.h>

bool file_object::IOCTL(unsigned long /*request*/, void* /*argument*/)
{
    if (!error) {
        error = Common::Error(Common::ErrorNotSupported, GetMessage(MessageNotSupported),
            Common::LocationOf("common/file_object", "IOCTL", 28));
    }
    return false;
}

std::uint64_t raccess_file::Size()
{
    std::uint64_t const position = SeekCurrent(0);
    std::uint64_t const size = SeekEnd(0);
    Seek(position);
    return size;
}

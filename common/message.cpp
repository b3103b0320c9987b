#include <common/message.h>

#include <common/bundle_api.h>
#include <common/message_table.h>
#include <common/zipopen.h>

#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <functional>
#include <memory>
#include <mutex>
#include <new>
#include <utility>
#include <vector>

namespace {

constinit std::atomic<MessageCatalogue const*> active{nullptr};  // null while it is the English table
constinit std::atomic<bool> subscribed{false};

MessageCatalogue const& CatalogueInForce()
{
    MessageCatalogue const* const catalogue = active.load(std::memory_order_acquire);
    return catalogue != nullptr ? *catalogue : BuiltInMessages();
}

/// All catalogues that were ever in force: errors hold texts of any of them, so none goes before the process.
struct LoadedCatalogues {
    LoadedCatalogues() = default;
    LoadedCatalogues(LoadedCatalogues const&) = delete;
    LoadedCatalogues& operator=(LoadedCatalogues const&) = delete;
    ~LoadedCatalogues() { active = nullptr; }

    std::vector<std::unique_ptr<unsigned char[]>> all;
};

/// The service calls this at each change of language, on the thread that makes it.
void ReloadMessages()
{
    // Held while loading: of two changes at once, the one that comes to load last finds the language of both.
    static std::mutex mutex;
    // Older than the subscription in any case, so that it ends later.
    static LoadedCatalogues loaded;  // guarded by mutex
    std::lock_guard const lock(mutex);
    unsigned size = 0;
    std::unique_ptr<unsigned char[]> bytes(ZipLoad(kMessageFile, &size));
    MessageCatalogue const* const catalogue = ReadCatalogue(bytes.get(), size);
    if (catalogue != nullptr) loaded.all.push_back(std::move(bytes));
    active.store(catalogue, std::memory_order_release);
    subscribed = true;
}

/// The service calls back before this returns. If it does not, the next look-up tries again.
void Subscribe()
{
    int const error = errno;
    try {
        BundleApi::SubscribeLanguageEvents(ReloadMessages);
        [[maybe_unused]] static int const registered =
            std::atexit([] { BundleApi::UnsubscribeLanguageEvents(ReloadMessages); });
    } catch (std::bad_alloc const&) {
        // The text that is wanted may well be the one about the lack of memory.
    }
    errno = error;
}

}

unsigned short const* GetMessage(unsigned key)
{
    if (!subscribed) Subscribe();
    return TextOf(CatalogueInForce(), key);
}

bool IsInCatalogue(unsigned short const* text)
{
    MessageCatalogue const& catalogue = CatalogueInForce();
    auto const* const bytes = reinterpret_cast<unsigned char const*>(text);
    auto const* const begin = reinterpret_cast<unsigned char const*>(&catalogue);
    return !std::less<>()(bytes, begin) && std::less<>()(bytes, begin + catalogue.size);
}

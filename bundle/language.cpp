#include <bundle/language.h>

#include <common/bundle_api.h>

#include <algorithm>
#include <cstdlib>
#include <mutex>
#include <optional>
#include <vector>

namespace {

using Callback = void (*)();

/// Lives as long as the process: other libraries' exit handlers call here.
struct State {
    std::mutex mutex;
    std::optional<std::string> language;  // guarded by mutex; nothing until the environment is asked
    std::vector<Callback> callbacks;      // guarded by mutex
};

State& TheState()
{
    static auto& state = *new State;
    return state;
}

std::string LanguageOfEnvironment()
{
    for (char const* const variable : {"LC_ALL", "LC_MESSAGES", "LANG"}) {
        char const* const value = std::getenv(variable);
        if (value != nullptr && *value != 0) return value;
    }
    return {};
}

bool Lists(std::string_view locales, std::string_view language)
{
    for (;;) {
        std::size_t const end = std::min(locales.find(','), locales.size());
        if (locales.substr(0, end) == language) return true;
        if (end == locales.size()) return false;
        locales.remove_prefix(end + 1);
    }
}

}

std::string LanguageInForce()
{
    State& state = TheState();
    std::lock_guard const lock(state.mutex);
    if (!state.language) state.language = LanguageOfEnvironment();
    return *state.language;
}

std::string_view MatchLanguage(std::string_view language, std::string_view locales)
{
    std::string_view const code = language.substr(0, language.find_first_of(".@"));
    for (std::string_view const candidate : {code, code.substr(0, code.find('_'))}) {
        if (!candidate.empty() && Lists(locales, candidate)) return candidate;
    }
    return {};
}

namespace BundleApi {

void SubscribeLanguageEvents(void (*callback)())
{
    State& state = TheState();
    {
        std::lock_guard const lock(state.mutex);
        if (std::ranges::find(state.callbacks, callback) == state.callbacks.end())
            state.callbacks.push_back(callback);
    }
    callback();
}

void UnsubscribeLanguageEvents(void (*callback)())
{
    State& state = TheState();
    std::lock_guard const lock(state.mutex);
    std::erase(state.callbacks, callback);
}

void SetLanguage(char const* language)
{
    State& state = TheState();
    std::vector<Callback> callbacks;
    {
        std::lock_guard const lock(state.mutex);
        state.language = language != nullptr ? language : LanguageOfEnvironment();
        callbacks = state.callbacks;
    }
    // Callbacks load files, and may subscribe or end their subscription.
    for (Callback const callback : callbacks)
        callback();
}

}

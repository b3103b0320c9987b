#pragma once

#include <string>
#include <string_view>

/// The language in force as it was named, such as "pt_BR.UTF-8"; empty if nothing names one. From any thread.
std::string LanguageInForce();

/// The entry of `locales`, a list with commas, for a language: its full code, or else its language without
/// the country. Empty if the list has neither.
std::string_view MatchLanguage(std::string_view language, std::string_view locales);

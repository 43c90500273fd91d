#include "profile/grid/PropertyValue.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <climits>
#include <limits>

namespace ac {

namespace {

bool IsIntegerKind(PropertyKind kind) {
    switch (kind) {
        case PropertyKind::Bool:
        case PropertyKind::Int:
        case PropertyKind::UInt:
        case PropertyKind::Short:
        case PropertyKind::UShort:
            return true;
        default:
            return false;
    }
}

// Out-of-range input is pinned to the kind's range rather than wrapped, so a typed "-1" in an
// unsigned row reads back as 0 and not as four thousand million.
long long ClampToKind(PropertyKind kind, long long value) {
    switch (kind) {
        case PropertyKind::Bool:
            return value != 0 ? 1 : 0;
        case PropertyKind::Int:
            return std::clamp<long long>(value, INT_MIN, INT_MAX);
        case PropertyKind::UInt:
            return std::clamp<long long>(value, 0, UINT_MAX);
        case PropertyKind::Short:
            return std::clamp<long long>(value, SHRT_MIN, SHRT_MAX);
        case PropertyKind::UShort:
            return std::clamp<long long>(value, 0, USHRT_MAX);
        default:
            return value;
    }
}

std::string_view TrimLeft(std::string_view text) {
    while (!text.empty() && std::isspace(static_cast<unsigned char>(text.front()))) {
        text.remove_prefix(1);
    }
    return text;
}

bool EqualsNoCase(std::string_view left, std::string_view right) {
    return std::equal(left.begin(), left.end(), right.begin(), right.end(), [](char a, char b) {
        return std::tolower(static_cast<unsigned char>(a)) ==
               std::tolower(static_cast<unsigned char>(b));
    });
}

}  // namespace

PropertyValue::PropertyValue(PropertyKind kind) : m_kind(kind) {
    if (IsIntegerKind(kind)) {
        m_storage = 0LL;
    } else if (kind == PropertyKind::Float || kind == PropertyKind::Double) {
        m_storage = 0.0;
    } else if (kind == PropertyKind::Char) {
        m_storage = '\0';
    }
}

std::string PropertyValue::GetText() const {
    if (m_useChosenSet) {
        return ChosenText();
    }
    if (const auto* text = std::get_if<std::string>(&m_storage)) {
        return *text;
    }
    if (const auto* character = std::get_if<char>(&m_storage)) {
        return *character == '\0' ? std::string() : std::string(1, *character);
    }
    if (const auto* integer = std::get_if<long long>(&m_storage)) {
        if (m_kind == PropertyKind::Bool && m_options.size() < 2) {
            return *integer != 0 ? "True" : "False";
        }
        if (!m_options.empty() && *integer >= 0 &&
            *integer < static_cast<long long>(m_options.size())) {
            return m_options[static_cast<std::size_t>(*integer)];
        }
    }
    return NumberText();
}

std::string PropertyValue::NumberText() const {
    char buffer[400];
    std::to_chars_result result{};
    if (const auto* integer = std::get_if<long long>(&m_storage)) {
        result = std::to_chars(buffer, buffer + sizeof buffer, *integer);
    } else {
        // Formatted without the C locale, so a German desktop still reads "1.50".
        result = std::to_chars(buffer, buffer + sizeof buffer, std::get<double>(m_storage),
                               std::chars_format::fixed, m_precision);
    }
    return result.ec == std::errc() ? std::string(buffer, result.ptr) : std::string();
}

void PropertyValue::SetText(const std::string& text) {
    m_pendingOption.clear();
    if (m_useChosenSet) {
        SetChosenText(text);
        return;
    }
    switch (m_kind) {
        case PropertyKind::Text:
            m_storage = text;
            return;
        case PropertyKind::Char:
            m_storage = text.empty() ? '\0' : text.front();
            return;
        case PropertyKind::Bool: {
            const bool ownTexts = m_options.size() >= 2;
            const std::string falseText = ownTexts ? m_options[0] : "False";
            const std::string trueText = ownTexts ? m_options[1] : "True";
            if (text == trueText || EqualsNoCase(text, "true")) {
                m_storage = 1LL;
            } else if (text == falseText || EqualsNoCase(text, "false")) {
                m_storage = 0LL;
            } else if (!ParseNumber(text)) {
                m_pendingOption = text;
            }
            return;
        }
        default:
            break;
    }
    if (const int option = FindOption(text); option >= 0 && IsIntegerKind(m_kind)) {
        m_storage = static_cast<long long>(option);
        return;
    }
    if (!ParseNumber(text) && IsIntegerKind(m_kind)) {
        m_pendingOption = text;
    }
}

bool PropertyValue::ParseNumber(const std::string& text) {
    const std::string_view digits = TrimLeft(text);
    const char* first = digits.data();
    const char* last = digits.data() + digits.size();
    if (first != last && *first == '+') {
        ++first;
    }
    if (auto* integer = std::get_if<long long>(&m_storage)) {
        long long parsed = 0;
        const auto result = std::from_chars(first, last, parsed);
        if (result.ec == std::errc::result_out_of_range) {
            parsed = (first != last && *first == '-') ? std::numeric_limits<long long>::min()
                                                      : std::numeric_limits<long long>::max();
        } else if (result.ec != std::errc()) {
            return false;
        }
        *integer = ClampToKind(m_kind, parsed);
        return true;
    }
    double parsed = 0.0;
    const auto result = std::from_chars(first, last, parsed);
    if (result.ec != std::errc()) {
        return false;
    }
    m_storage = m_kind == PropertyKind::Float ? static_cast<double>(static_cast<float>(parsed))
                                              : parsed;
    return true;
}

void PropertyValue::AddOption(const std::string& text) {
    m_options.push_back(text);
    // A client may set the value's text before it adds the options that give it a meaning.
    if (!m_pendingOption.empty() && text == m_pendingOption) {
        m_pendingOption.clear();
        if (m_kind == PropertyKind::Bool) {
            if (m_options.size() <= 2) {
                m_storage = static_cast<long long>(m_options.size() - 1);
            }
        } else {
            m_storage = static_cast<long long>(m_options.size() - 1);
        }
    }
}

void PropertyValue::RemoveOptions() {
    m_options.clear();
    m_chosen.clear();
}

int PropertyValue::FindOption(const std::string& text) const {
    const auto found = std::find(m_options.begin(), m_options.end(), text);
    return found == m_options.end() ? -1 : static_cast<int>(found - m_options.begin());
}

std::vector<std::string> PropertyValue::ChoiceTexts() const {
    if (m_kind == PropertyKind::Bool && m_options.size() < 2) {
        return {"False", "True"};
    }
    return m_options;
}

void PropertyValue::UseChosenSet(bool use) {
    m_useChosenSet = use;
}

void PropertyValue::SetChosen(std::size_t index, bool chosen) {
    if (index >= m_chosen.size()) {
        if (!chosen) {
            return;
        }
        m_chosen.resize(index + 1, false);
    }
    m_chosen[index] = chosen;
}

bool PropertyValue::IsChosen(std::size_t index) const {
    return index < m_chosen.size() && m_chosen[index];
}

void PropertyValue::SetPrecision(int precision) {
    m_precision = std::clamp(precision, 0, 30);
}

std::string PropertyValue::ChosenText() const {
    std::string joined;
    for (std::size_t index = 0; index < m_options.size(); ++index) {
        if (IsChosen(index)) {
            if (!joined.empty()) {
                joined += m_separator;
            }
            joined += m_options[index];
        }
    }
    return joined;
}

void PropertyValue::SetChosenText(const std::string& text) {
    m_chosen.assign(m_options.size(), false);
    if (m_separator.empty()) {
        SetChosen(static_cast<std::size_t>(std::max(FindOption(text), 0)), FindOption(text) >= 0);
        return;
    }
    std::size_t start = 0;
    while (start <= text.size()) {
        std::size_t end = text.find(m_separator, start);
        if (end == std::string::npos) {
            end = text.size();
        }
        if (const int option = FindOption(text.substr(start, end - start)); option >= 0) {
            m_chosen[static_cast<std::size_t>(option)] = true;
        }
        start = end + m_separator.size();
    }
}

}  // namespace ac

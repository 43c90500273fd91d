#pragma once
// PropertyValue: one value of the property grid, with its kind, its list of options and the set of
// chosen options. Every value reads and writes as text; the kind decides the text form.
//
// Thread contract: a plain value; the grid uses it on the UI thread only.

#include "profile/grid/PropertiesCtrl.h"

#include <cstddef>
#include <string>
#include <variant>
#include <vector>

namespace ac {

class PropertyValue {
public:
    explicit PropertyValue(PropertyKind kind = PropertyKind::Text);

    PropertyKind Kind() const { return m_kind; }

    // The text form of the kind. With options, a bool or integer value shows its option's text;
    // with the chosen set in use, the chosen options joined by the separator.
    std::string GetText() const;
    // Parses by the kind; a text the kind cannot read leaves the value as it was.
    void SetText(const std::string& text);

    // Options keep the order of adding.
    void AddOption(const std::string& text);
    void RemoveOptions();
    const std::vector<std::string>& Options() const { return m_options; }
    // Index of the option whose text is exactly `text`; -1 for none.
    int FindOption(const std::string& text) const;
    // What a drop-down offers: the options, or "False" and "True" for a bool without its own.
    std::vector<std::string> ChoiceTexts() const;

    // Several chosen options, for editors that tick more than one.
    void UseChosenSet(bool use);
    bool UsesChosenSet() const { return m_useChosenSet; }
    void SetChosen(std::size_t index, bool chosen);
    bool IsChosen(std::size_t index) const;

    int Precision() const { return m_precision; }
    void SetPrecision(int precision);
    const std::string& Separator() const { return m_separator; }
    void SetSeparator(const std::string& separator) { m_separator = separator; }

private:
    using Storage = std::variant<std::string, long long, double, char>;

    std::string NumberText() const;
    bool ParseNumber(const std::string& text);
    std::string ChosenText() const;
    void SetChosenText(const std::string& text);

    PropertyKind m_kind;
    // Integers of every width (and bool as 0/1) live in the long long; their ranges are kept by
    // SetText, so the text forms "%d", "%u", "%hd", "%hu" all read from it.
    Storage m_storage;
    std::vector<std::string> m_options;
    std::vector<bool> m_chosen;
    bool m_useChosenSet = false;
    int m_precision = 2;
    std::string m_separator = ";";
    // An option text given before its option was added; taken up by AddOption.
    std::string m_pendingOption;
};

}  // namespace ac

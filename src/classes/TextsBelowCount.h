// The texts of one field of a list's slots below its count, for the builds
// that drop an FC function whose text a slot below count holds already
// (PortController by serial, LogicalPortGroup by node WWN): one lookup per
// function instead of a walk over the slots, so a build costs as much per
// function at 4,096 functions as at 16.
//
// While a build runs, every fill writes its slot at or above count (the slot
// of a dense list is count itself, that of an ordinal list its ordinal, which
// count never passes), so a slot below count never changes again. Its text is
// taken once, when count has passed it; until then the lookup does not see it,
// just as the walk below count did not. Texts are compared as strcmp compares
// them, case and all; a field without a terminator ends at its array's end.
#ifndef VEXLAN_CLASSES_TEXTSBELOWCOUNT_H
#define VEXLAN_CLASSES_TEXTSBELOWCOUNT_H

#include <cstddef>
#include <cstring>
#include <string_view>
#include <unordered_map>

#include "classes/ClassModule.h"

template <class Entry, std::size_t N>
class TextsBelowCount {
public:
    TextsBelowCount(const ClassList<Entry>& list, char (Entry::*field)[N]) : list_(list), field_(field) {}

    // The first slot below count whose text is `text`, or -1.
    int find(const char* text)
    {
        takeNewSlots();
        const auto found = firstSlot_.find(std::string_view(text));
        return found == firstSlot_.end() ? -1 : found->second;
    }

private:
    void takeNewSlots()
    {
        if (list_.entries == nullptr)
            return;
        for (; taken_ < list_.count; ++taken_) {
            const char* text = list_.entries[taken_].*field_;
            // emplace keeps the first slot of a text
            firstSlot_.emplace(std::string_view(text, strnlen(text, N)), taken_);
        }
    }

    const ClassList<Entry>& list_;
    char (Entry::*field_)[N];
    int taken_ = 0;
    // Views into the list's block, which stays put for the build.
    std::unordered_map<std::string_view, int> firstSlot_;
};

#endif

/* packed_texts.cpp: keeps texts in blocks. A block moves only while it is filled, so there is never a second copy of
 * all texts. */

#include "check/packed_texts.h"

namespace check {

void packed_texts::add(std::string_view text) {
    if (ends.size() % BLOCK == 0) {
        if (!blocks.empty())
            blocks.back().shrink_to_fit();
        blocks.emplace_back();
    }
    std::string &block = blocks.back();
    block += text;
    ends.push_back(static_cast<offset>(block.size()));
}

void packed_texts::clear() {
    blocks.clear();
    ends.clear();
}

} // namespace check

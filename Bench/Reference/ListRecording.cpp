#include "Bench/Reference/ListRecording.h"

#include <iterator>
#include <set>
#include <string>
#include <utility>

namespace ZorvaTouch::Reference {

void ListRecording::append(Frame frame) {
    _frames.push_back(std::move(frame));
    if (_bound != 0 && _frames.size() >= 2 * _bound)
        trim();
}

void ListRecording::trim() {
    std::uint64_t kept = 0;
    std::set<std::string> keys; // of the state writes met since the last kept frame of another kind
    for (auto next = _frames.end(); next != _frames.begin();) {
        const auto frame = std::prev(next);
        bool keeps = false;
        if (frame->type == FrameType::State) {
            keeps = keys.insert(frame->key).second;
        } else if (kept < _bound) {
            keeps = true;
            ++kept;
            keys.clear();
        }
        next = keeps ? frame : _frames.erase(frame);
    }
}

} // namespace ZorvaTouch::Reference

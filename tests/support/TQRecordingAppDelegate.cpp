#include "tests/support/TQRecordingAppDelegate.h"

#include <algorithm>
#include <cstdio>

std::string TQDelegateCall::describe() const {
    if (operation == "postNotification") {
        char hex[16];
        std::snprintf(hex, sizeof hex, "0x%x", static_cast<unsigned>(word));
        return operation + "(" + hex + ")";
    }
    if (operation == "addToUndo")
        return operation + "(" + std::to_string(type) + "," + std::to_string(action) + "," + text +
               ")";
    if (operation == "addChannelToUndo") return operation + "(" + channelName + "," + text + ")";
    if (operation == "startCaptureModifiedChannels") return operation + "(" + text + ")";
    if (channel || !channelName.empty()) return operation + "(" + channelName + ")";
    if (operation == "setCurrentTime") {
        char seconds[32];
        std::snprintf(seconds, sizeof seconds, "%g", CMTimeGetSeconds(time));
        return operation + "(" + seconds + ")";
    }
    return operation + "()";
}

TQDelegateCall& TQRecordingAppDelegate::record(std::string_view operation) {
    TQDelegateCall& call = _calls.emplace_back();
    call.operation = operation;
    return call;
}

TQDelegateCall& TQRecordingAppDelegate::recordChannel(std::string_view operation,
                                                      const TQChannelBase* channel) {
    TQDelegateCall& call = record(operation);
    call.channel = channel;
    call.channelName = channel ? channel->getName() : std::string("null");
    return call;
}

std::vector<std::string> TQRecordingAppDelegate::bracketSequence() const {
    std::vector<std::string> out;
    for (const auto& c : _calls)
        for (const char* o :
             {"startCaptureModifiedChannels", "endCaptureModifiedChannels", "willChangeChannel",
              "didChangeChannel", "willSetChannelValue", "didSetChannelValue", "addChannelToUndo",
              "addToUndo", "postNotification"})
            if (c.operation == o) out.push_back(c.describe());
    return out;
}

std::string TQRecordingAppDelegate::bracketText() const {
    std::vector<std::string> tokens;
    for (const auto& c : _calls) {
        const std::string& o = c.operation;
        if (o == "startCaptureModifiedChannels") tokens.push_back("{" + c.text);
        if (o == "endCaptureModifiedChannels") tokens.push_back("}");
        if (o == "willChangeChannel") tokens.push_back("<" + c.channelName);
        if (o == "didChangeChannel") tokens.push_back(c.channelName + ">");
        if (o == "willSetChannelValue") tokens.push_back("(" + c.channelName);
        if (o == "didSetChannelValue") tokens.push_back(c.channelName + ")");
        if (o == "addChannelToUndo") tokens.push_back("+" + c.channelName + ":" + c.text);
        if (o == "addToUndo")
            tokens.push_back("+" + std::to_string(c.type) + "." + std::to_string(c.action) + ":" +
                             c.text);
        if (o == "postNotification") {
            char hex[16];
            std::snprintf(hex, sizeof hex, "!%x", static_cast<unsigned>(c.word));
            tokens.push_back(hex);
        }
    }
    // Greedy: at each place the group of up to eight calls that repeats over the most calls.
    std::string out;
    for (size_t i = 0; i < tokens.size();) {
        size_t bestLength = 1, bestRepeats = 1;
        for (size_t k = 1; k <= 8 && i + 2 * k <= tokens.size(); ++k) {
            size_t r = 1;
            while (
                i + (r + 1) * k <= tokens.size() &&
                std::equal(tokens.begin() + i, tokens.begin() + i + k, tokens.begin() + i + r * k))
                ++r;
            if (r > 1 && r * k > bestRepeats * bestLength) bestLength = k, bestRepeats = r;
        }
        // Appended piece by piece: GCC 12 at -O3 takes a prefixed string for an overlapping copy.
        if (!out.empty()) out += ' ';
        if (bestRepeats > 1) out.append(std::to_string(bestRepeats)).append("*[");
        for (size_t k = 0; k < bestLength; ++k) (k ? out += ' ' : out) += tokens[i + k];
        if (bestRepeats > 1) out += ']';
        i += bestLength * bestRepeats;
    }
    return out;
}

size_t TQRecordingAppDelegate::count(std::string_view operation) const {
    return static_cast<size_t>(std::count_if(
        _calls.begin(), _calls.end(), [&](const auto& c) { return c.operation == operation; }));
}

int TQRecordingAppDelegate::captureBalance() const {
    return static_cast<int>(count("startCaptureModifiedChannels")) -
           static_cast<int>(count("endCaptureModifiedChannels"));
}

void TQRecordingAppDelegate::addReceiver(TQNotificationReceiver* receiver) {
    if (receiver && std::find(_receivers.begin(), _receivers.end(), receiver) == _receivers.end())
        _receivers.push_back(receiver);
}

void TQRecordingAppDelegate::removeReceiver(TQNotificationReceiver* receiver) {
    std::erase(_receivers, receiver);
}

// --- Scene and time ---

void TQRecordingAppDelegate::setCurrentTime(const CMTime& time) {
    record("setCurrentTime").time = time;
    if (_forward)
        _forward->setCurrentTime(time);
    else
        answers.currentTime = time;
}

void TQRecordingAppDelegate::abort() {
    record("abort");
    if (_forward)
        _forward->abort();
    else
        answers.playing = false;
}

// --- Object selection ---

bool TQRecordingAppDelegate::isObjectSelected(const TQChannelBase* objectRoot) {
    recordChannel("isObjectSelected", objectRoot);
    if (_forward) return _forward->isObjectSelected(objectRoot);
    return objectRoot && std::find(answers.selectedObjects.begin(), answers.selectedObjects.end(),
                                   objectRoot) != answers.selectedObjects.end();
}

// --- Change tracking ---

bool TQRecordingAppDelegate::wasChannelModified(const TQChannelBase* channel) {
    recordChannel("wasChannelModified", channel);
    if (_forward) return _forward->wasChannelModified(channel);
    return channel && std::find(answers.modified.begin(), answers.modified.end(), channel) !=
                          answers.modified.end();
}

std::vector<TQChannelRef> TQRecordingAppDelegate::modifiedChannels() {
    record("modifiedChannels");
    if (_forward) return _forward->modifiedChannels();
    std::vector<TQChannelRef> refs;
    for (const TQChannelBase* channel : answers.modified)
        refs.emplace_back(channel, answers.sceneChannelRoot);
    return refs;
}

void TQRecordingAppDelegate::resetModifiedChannels() {
    record("resetModifiedChannels");
    if (_forward)
        _forward->resetModifiedChannels();
    else
        answers.modified.clear();
}

void TQRecordingAppDelegate::postNotification(TQNotificationWord word) {
    record("postNotification").word = word;
    if (_forward) {
        _forward->postNotification(word);
        return;
    }
    // A copy: a receiver may add or remove receivers from inside notify.
    const std::vector<TQNotificationReceiver*> receivers = _receivers;
    for (TQNotificationReceiver* receiver : receivers)
        if (std::find(_receivers.begin(), _receivers.end(), receiver) != _receivers.end())
            receiver->notify(word);
}

// --- Edit brackets and undo ---

void TQRecordingAppDelegate::addToUndo(void* object, uint32_t type, uint32_t action,
                                       const BNString& undoDescription) {
    TQDelegateCall& call = record("addToUndo");
    call.object = object;
    call.type = type;
    call.action = action;
    call.text = undoDescription;
    if (_forward) _forward->addToUndo(object, type, action, undoDescription);
}

#include "host/TQHostScene.h"

#include <algorithm>

TQHostScene::TQHostScene(TQHostObjectFamily family)
    : _family(family), _root(std::make_unique<TQChannelFolder>("Scene", 0)) {}

// --- Objects ---

TQChannelObjectRootBase* TQHostScene::addObject(const BNString& name,
                                                const TQHostObjectOptions& options) {
    return adoptObject(TQHostMakeObject(name, nextObjectId(), _family, options));
}

TQChannelObjectRootBase* TQHostScene::adoptObject(std::unique_ptr<TQChannelObjectRootBase> object) {
    if (!object) return nullptr;
    if (objectWithId(object->getChannelId())) {
        // Ids are identity within the scene: references name objects by them.
        auto fresh = std::make_unique<TQChannelObjectRootBase>(object->getName(), nextObjectId());
        // A root's id is fixed at construction: move the children over to a root with the new id.
        while (object->numberOfChildren() > 0) {
            if (TQChannelBase* child = object->getChild(0)) {
                fresh->addChild(object->takeChild(child));
            } else {
                fresh->addChild(nullptr);  // keep empty slots where they were
                object->removeChildAt(0);
            }
        }
        *fresh = *object;  // the root's own state; its children came over above
        fresh->setTimeOffset(object->ownTimeOffset());
        fresh->setTimeExtent(object->timeExtent());
        object = std::move(fresh);
    }
    return static_cast<TQChannelObjectRootBase*>(_root->addChild(std::move(object)));
}

bool TQHostScene::removeObject(const TQChannelBase* object) {
    TQChannelObjectRootBase* found = asObject(object);
    if (!found) return false;
    std::erase(_selection, found->getChannelId());
    return _root->removeChild(found);
}

void TQHostScene::removeAllObjects() {
    _selection.clear();
    _root->removeAllChildren();
}

void TQHostScene::reset(TQHostObjectFamily family) {
    removeAllObjects();
    _family = family;
}

std::vector<TQChannelObjectRootBase*> TQHostScene::objects() const {
    std::vector<TQChannelObjectRootBase*> out;
    out.reserve(_root->numberOfChildren());
    for (size_t i = 0; i < _root->numberOfChildren(); ++i)
        if (auto* object = dynamic_cast<TQChannelObjectRootBase*>(_root->getChild(i)))
            out.push_back(object);
    return out;
}

size_t TQHostScene::numberOfObjects() const { return objects().size(); }

TQChannelObjectRootBase* TQHostScene::objectWithId(TQChannelId objectId) const {
    return dynamic_cast<TQChannelObjectRootBase*>(_root->findChild(objectId));
}

TQChannelObjectRootBase* TQHostScene::objectNamed(const BNString& name) const {
    for (TQChannelObjectRootBase* object : objects())
        if (object->getName() == name) return object;
    return nullptr;
}

TQChannelObjectRootBase* TQHostScene::objectOf(const TQChannelBase* channel) const {
    for (const TQChannelBase* node = channel; node; node = node->getParent())
        if (node->getParent() == _root.get()) return asObject(node);
    return nullptr;
}

TQChannelObjectRootBase* TQHostScene::asObject(const TQChannelBase* channel) const {
    if (!channel || channel->getParent() != _root.get()) return nullptr;
    return dynamic_cast<TQChannelObjectRootBase*>(const_cast<TQChannelBase*>(channel));
}

TQChannelId TQHostScene::nextObjectId() const {
    TQChannelId highest = 0;
    for (size_t i = 0; i < _root->numberOfChildren(); ++i)
        if (const TQChannelBase* child = _root->getChild(i))
            highest = std::max(highest, child->getChannelId());
    return highest + 1;
}

// --- Selection ---

bool TQHostScene::selectObject(const TQChannelBase* object, bool extend) {
    TQChannelObjectRootBase* found = asObject(object);
    if (!found) return false;
    const TQChannelId id = found->getChannelId();
    if (!extend) {
        if (_selection.size() == 1 && _selection.front() == id) return false;
        _selection.assign(1, id);
        return true;
    }
    if (std::find(_selection.begin(), _selection.end(), id) != _selection.end()) return false;
    _selection.push_back(id);
    return true;
}

bool TQHostScene::deselectObject(const TQChannelBase* object) {
    TQChannelObjectRootBase* found = asObject(object);
    return found && std::erase(_selection, found->getChannelId()) > 0;
}

bool TQHostScene::setSelection(const std::vector<TQChannelBase*>& objects) {
    std::vector<TQChannelId> ids;
    for (const TQChannelBase* object : objects) {
        TQChannelObjectRootBase* found = asObject(object);
        if (found && std::find(ids.begin(), ids.end(), found->getChannelId()) == ids.end())
            ids.push_back(found->getChannelId());
    }
    if (ids == _selection) return false;
    _selection = std::move(ids);
    return true;
}

bool TQHostScene::clearSelection() {
    if (_selection.empty()) return false;
    _selection.clear();
    return true;
}

std::vector<TQChannelBase*> TQHostScene::selectedObjects() const {
    std::vector<TQChannelBase*> out;
    out.reserve(_selection.size());
    for (TQChannelId id : _selection)
        if (TQChannelObjectRootBase* object = objectWithId(id)) out.push_back(object);
    return out;
}

bool TQHostScene::isObjectSelected(const TQChannelBase* object) const {
    TQChannelObjectRootBase* found = asObject(object);
    return found && std::find(_selection.begin(), _selection.end(), found->getChannelId()) !=
                        _selection.end();
}

bool TQHostScene::hasSelection() const {
    return std::any_of(_selection.begin(), _selection.end(),
                       [this](TQChannelId id) { return objectWithId(id) != nullptr; });
}

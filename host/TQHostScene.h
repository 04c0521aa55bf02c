#pragma once
// The reference host's scene: a root folder whose children are the objects, each an object
// root (TQChannelObjectRootBase) laid out by TQHostObjectModel. References that the host
// hands out (modified channels, undo) are relative to the scene root and so begin with the
// object's id: "./<object id>/1/100/101/1".
//
// The scene owns its objects. Object selection is kept as object ids in selection order, so
// that an object destroyed behind the scene's back simply drops out of the selection.

#include <cstddef>
#include <memory>
#include <vector>

#include "host/TQHostObjectModel.h"
#include "platform/channels/TQChannelFolder.h"
#include "platform/channels/TQChannelObjectRootBase.h"

class TQHostScene {
public:
    explicit TQHostScene(TQHostObjectFamily family = TQHostObjectFamily::Kestrel);
    TQHostScene(const TQHostScene&) = delete;
    TQHostScene& operator=(const TQHostScene&) = delete;

    TQHostObjectFamily family() const { return _family; }
    bool isKestrel() const { return _family == TQHostObjectFamily::Kestrel; }

    TQChannelFolder& root() { return *_root; }
    const TQChannelFolder& root() const { return *_root; }

    // --- Objects ---
    // A new object of the scene's family, with the next free object id, appended.
    TQChannelObjectRootBase* addObject(const BNString& name,
                                       const TQHostObjectOptions& options = {});
    // Takes ownership of an object built elsewhere. Its id is kept when no other object has it,
    // and replaced by the next free id otherwise. Null is ignored (answers null).
    TQChannelObjectRootBase* adoptObject(std::unique_ptr<TQChannelObjectRootBase> object);
    // Destroys the object; false when it is not an object of this scene.
    bool removeObject(const TQChannelBase* object);
    // Destroys every object.
    void removeAllObjects();
    // Destroys every object; objects added from now on are of `family`.
    void reset(TQHostObjectFamily family);

    std::vector<TQChannelObjectRootBase*> objects() const;
    size_t numberOfObjects() const;
    TQChannelObjectRootBase* objectWithId(TQChannelId objectId) const;
    TQChannelObjectRootBase* objectNamed(const BNString& name) const;
    // The object root at or above a channel of this scene; null for anything else.
    TQChannelObjectRootBase* objectOf(const TQChannelBase* channel) const;

    // --- Selection ---
    // Answers whether the selection changed. Objects that are not this scene's are ignored.
    bool selectObject(const TQChannelBase* object, bool extend = false);
    bool deselectObject(const TQChannelBase* object);
    bool setSelection(const std::vector<TQChannelBase*>& objects);
    bool clearSelection();
    std::vector<TQChannelBase*> selectedObjects() const;
    bool isObjectSelected(const TQChannelBase* object) const;
    bool hasSelection() const;

private:
    // An object root that is a direct child of the scene root.
    TQChannelObjectRootBase* asObject(const TQChannelBase* channel) const;
    TQChannelId nextObjectId() const;

    TQHostObjectFamily _family;
    std::unique_ptr<TQChannelFolder> _root;
    std::vector<TQChannelId> _selection;
};

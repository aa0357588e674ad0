// Cursor shapes that a page can ask for: the words of the "cursor" property, in the engine's order.
#pragma once

namespace qorvex {

struct CursorTypes {
    enum Cursors : unsigned {
        Alias = 0,
        AllScroll,
        Auto,
        Cell,
        ContextMenu,
        ColResize,
        Copy,
        Crosshair,
        Default,
        EResize,
        EwResize,
        Grab,
        Grabbing,
        Help,
        Move,
        NResize,
        NeResize,
        NeswResize,
        NsResize,
        NwResize,
        NwseResize,
        NoDrop,
        None,
        NotAllowed,
        Pointer,
        Progress,
        RowResize,
        SResize,
        SeResize,
        SwResize,
        Text,
        URL,  // the callback's url tells which image
        VerticalText,
        WResize,
        Wait,
        ZoomIn,
        ZoomOut,
    };
};

}  // namespace qorvex

// SPDX-License-Identifier: MIT
#pragma once

#include <gst/gst.h>

#include "handle/Handle.h"

namespace gst {

using handle::kAdopt;
using handle::kRef;
using handle::kSink;
using handle::SharedHandle;
using handle::UniqueHandle;

template<typename T>
struct ObjectTraits {
    using Pointer = T*;
    static void ref(T* object) { gst_object_ref(object); }
    static void sink(T* object) { gst_object_ref_sink(object); }
    static void release(T* object) { gst_object_unref(object); }
};

template<typename T>
struct MiniObjectTraits {
    using Pointer = T*;
    static void ref(T* object) { gst_mini_object_ref(GST_MINI_OBJECT_CAST(object)); }
    static void release(T* object) { gst_mini_object_unref(GST_MINI_OBJECT_CAST(object)); }
};

struct ErrorTraits {
    using Pointer = GError*;
    static void release(GError* error) { g_error_free(error); }
};

struct CharsTraits {
    using Pointer = char*;
    static void release(char* chars) { g_free(chars); }
};

using Element = SharedHandle<ObjectTraits<GstElement>>;
using Pad = SharedHandle<ObjectTraits<GstPad>>;
using Bus = SharedHandle<ObjectTraits<GstBus>>;
using StreamCollection = SharedHandle<ObjectTraits<GstStreamCollection>>;
using Clock = SharedHandle<ObjectTraits<GstClock>>;
using Message = SharedHandle<MiniObjectTraits<GstMessage>>;
using Caps = SharedHandle<MiniObjectTraits<GstCaps>>;
using Query = SharedHandle<MiniObjectTraits<GstQuery>>;
using Error = UniqueHandle<ErrorTraits>;
using Chars = UniqueHandle<CharsTraits>;

/** A new element, or an empty handle when this installation has none of that name. */
inline Element makeElement(const char* factory, const char* name = nullptr) {
    return Element(kSink, gst_element_factory_make(factory, name));
}

inline Pad staticPad(const Element& element, const char* name) {
    return Pad(kAdopt, gst_element_get_static_pad(element.get(), name));
}

} // namespace gst

// The lists and maps that nodes hand out.
#include "dom/attr.h"
#include "dom/dom_string_map.h"
#include "dom/dom_token_list.h"
#include "dom/node_list.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/collection_access.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using dom::DOMTokenList;

// --- NodeList, HTMLCollection, NamedNodeMap

dom::Node* GetListItem(dom::NodeList& list, uint32_t index) {
    return list.GetItem(index);
}
dom::Attr* GetMapItem(dom::NamedNodeMap& map, uint32_t index) {
    return map.GetItem(index);
}

using BindList = Binding<dom::NodeList>;
constexpr AttributeDescription kListAttributes[] = {BindList::ReadOnly<&dom::NodeList::GetLength>("length")};
constexpr MethodDescription kListMethods[] = {BindList::Method<"item", &GetListItem, 1>()};

using BindMap = Binding<dom::NamedNodeMap>;
constexpr AttributeDescription kMapAttributes[] = {
    BindMap::ReadOnly<&dom::NamedNodeMap::GetLength>("length")};
constexpr MethodDescription kMapMethods[] = {BindMap::Method<"item", &GetMapItem, 1>()};

// --- DOMTokenList

// One call with each argument in turn.
template <auto kOperation>
void ForEachToken(DOMTokenList& list, ScriptCall& call) {
    for (JSValueRef argument : call.arguments) {
        ScriptText token;
        if (!token.Read(call.context, argument, call.exception)) return;
        (list.*kOperation)(token.view());
    }
}

std::optional<Atom> GetToken(DOMTokenList& list, uint32_t index) {
    const Atom token = list.GetItem(index);
    return token ? std::optional<Atom>(token) : std::nullopt;
}

using BindTokens = Binding<DOMTokenList>;
constexpr AttributeDescription kTokenAttributes[] = {
    BindTokens::ReadOnly<&DOMTokenList::GetLength>("length"),
    BindTokens::ReadWrite<&DOMTokenList::GetValue, &DOMTokenList::SetValue>("value"),
};
constexpr MethodDescription kTokenMethods[] = {
    BindTokens::Method<"add", &ForEachToken<&DOMTokenList::Add>, 1>(),
    BindTokens::Method<"contains", &DOMTokenList::Contains, 1>(),
    BindTokens::Method<"item", &GetToken, 1>(),
    BindTokens::Method<"remove", &ForEachToken<&DOMTokenList::Remove>, 1>(),
    BindTokens::Method<"replace", &DOMTokenList::Replace, 2>(),
    BindTokens::Method<"supports", &DOMTokenList::Supports, 1>(),
    BindTokens::Method<"toggle", &DOMTokenList::Toggle, 1>(),
};

// --- DOMStringMap: properties are the entries.

bool HasEntry(JSContextRef context, JSObjectRef object, JSStringRef name) {
    auto* map = NativeOf<dom::DOMStringMap>(context, object);
    ScriptText key;
    key.Read(name);
    return map && map->Get(key.view()).has_value();
}

JSValueRef GetEntry(JSContextRef context, JSObjectRef object, JSStringRef name, JSValueRef*) {
    auto* map = NativeOf<dom::DOMStringMap>(context, object);
    ScriptText key;
    key.Read(name);
    const std::optional<Atom> value = map ? map->Get(key.view()) : std::nullopt;
    return value ? ToScript(context, *value) : JSValueMakeUndefined(context);
}

bool SetEntry(JSContextRef context, JSObjectRef object, JSStringRef name, JSValueRef value,
              JSValueRef* exception) {
    auto* map = NativeOf<dom::DOMStringMap>(context, object);
    ScriptText key, text;
    key.Read(name);
    if (!map || !text.Read(context, value, exception)) return true;
    if (!map->Set(key.view(), text.view())) {
        String message("Failed to set the '");
        message.append(key.view());
        message.append("' property on 'DOMStringMap': it is not a valid property name.");
        RaiseError(context, message.view(), exception);
    }
    HandOverPendingException(context, exception);
    return true;
}

bool DeleteEntry(JSContextRef context, JSObjectRef object, JSStringRef name, JSValueRef*) {
    auto* map = NativeOf<dom::DOMStringMap>(context, object);
    ScriptText key;
    key.Read(name);
    return map && map->Delete(key.view());
}

void ListEntries(JSContextRef context, JSObjectRef object, JSPropertyNameAccumulatorRef names) {
    auto* map = NativeOf<dom::DOMStringMap>(context, object);
    for (size_t i = 0; map && i < map->GetLength(); ++i) {
        JSStringRef name = JSStringCreateWithUTF8CString(map->GetKey(i).c_str());
        JSPropertyNameAccumulatorAddName(names, name);
        JSStringRelease(name);
    }
}

}  // namespace

const ClassDescription kNodeListClass = {
    .script_class = ScriptClass::NodeList,
    .attributes = kListAttributes,
    .methods = kListMethods,
    .properties = IndexedAccess<dom::NodeList, &dom::NodeList::GetItem>()};

// A snapshot list under a name of its own: what it has comes from NodeList.
const ClassDescription kHTMLCollectionClass = {
    .script_class = ScriptClass::HTMLCollection,
    .properties = IndexedAccess<dom::NodeList, &dom::NodeList::GetItem>()};

const ClassDescription kNamedNodeMapClass = {
    .script_class = ScriptClass::NamedNodeMap,
    .attributes = kMapAttributes,
    .methods = kMapMethods,
    .properties = IndexedAccess<dom::NamedNodeMap, &dom::NamedNodeMap::GetItem>()};

const ClassDescription kDOMTokenListClass = {
    .script_class = ScriptClass::DOMTokenList,
    .attributes = kTokenAttributes,
    .methods = kTokenMethods,
    .properties = IndexedAccess<DOMTokenList, &DOMTokenList::GetItem>()};

const ClassDescription kDOMStringMapClass = {
    .script_class = ScriptClass::DOMStringMap,
    .properties = {HasEntry, GetEntry, SetEntry, DeleteEntry, ListEntries}};

}  // namespace qorvex::script

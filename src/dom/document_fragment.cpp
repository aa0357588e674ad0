#include "dom/document_fragment.h"

#include "dom/document.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

RefPtr<Node> DocumentFragment::CloneNode(bool deep) {
    RefPtr<DocumentFragment> clone = script::MakeHandle<DocumentFragment>(*GetDocument());
    CopyCommon(*clone, deep);
    return clone;
}

RefPtr<Node> DocumentType::CloneNode(bool deep) {
    RefPtr<DocumentType> clone = script::MakeHandle<DocumentType>(*GetDocument());
    CopyCommon(*clone, deep);
    return clone;
}

RefPtr<Node> DataBindElement::CloneNode(bool deep) {
    RefPtr<DataBindElement> clone = script::MakeHandle<DataBindElement>(*GetDocument());
    CopyCommon(*clone, deep);
    return clone;
}

}  // namespace qorvex::dom

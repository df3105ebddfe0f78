#pragma once

#include <korvex/Export.h>

// XmlNode is the class of XML elements in the interface of Korvex: xml::node of xmlwrapp, or a
// replacement of that name if Korvex was built without xmlwrapp. A folder on the include path
// decides which.
#if __has_include(<korvex-compat/XmlNode.h>)
#include <korvex-compat/XmlNode.h>
KORVEX_NAMESPACE(korvex) {
using XmlNode = ::xml::korvex_compat::node;
}  // KORVEX_NAMESPACE(korvex)
#else
#include <xmlwrapp/node.h>
KORVEX_NAMESPACE(korvex) {
using XmlNode = ::xml::node;
}  // KORVEX_NAMESPACE(korvex)
#endif

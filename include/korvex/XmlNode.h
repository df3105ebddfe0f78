#pragma once

#include <korvex/Export.h>

// A folder on the include path decides which class this is.
#if __has_include(<korvex-compat/XmlNode.h>)
#include <korvex-compat/XmlNode.h>
KORVEX_NAMESPACE(korvex) {
// The class of XML elements in the interface of Korvex: a replacement of xmlwrapp's xml::node.
using XmlNode = ::xml::korvex_compat::node;
}  // KORVEX_NAMESPACE(korvex)
#else
#include <xmlwrapp/node.h>
KORVEX_NAMESPACE(korvex) {
// The class of XML elements in the interface of Korvex: xmlwrapp's.
using XmlNode = ::xml::node;
}  // KORVEX_NAMESPACE(korvex)
#endif

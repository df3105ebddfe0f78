#pragma once

#include <korvex/Export.h>

// XmlNode is the class of XML elements that this Korvex takes and hands out: xmlwrapp's xml::node,
// or Korvex's own of that name where it was built without xmlwrapp. Which it is, a folder on the
// include path tells.
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

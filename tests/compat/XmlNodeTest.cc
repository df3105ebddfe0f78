#include <gtest/gtest.h>
#include <xmlwrapp/node.h>

#include <string>
#include <utility>

namespace {

std::string text(const xml::node& node) {
    return std::string(node.get_name()) + "=" + node.get_content();
}

TEST(XmlNodeTest, IsBuiltFromNothingANameOrBoth) {
    EXPECT_EQ(text(xml::node()), "blank=");
    EXPECT_EQ(text(xml::node("name")), "name=");
    EXPECT_EQ(text(xml::node("name", "content")), "name=content");
}

TEST(XmlNodeTest, ContentIsTakenAsItStands) {
    for (const char* content : {"", "a & b", "&amp;", "<x>", "\xc3\xa4", "&undefined;"}) {
        EXPECT_STREQ(xml::node("n", content).get_content(), content);
    }
}

TEST(XmlNodeTest, NameAndContentCanBeChanged) {
    xml::node node("a", "1");
    node.set_name("b");
    node.set_content("2");
    node.set_content("3");
    EXPECT_EQ(text(node), "b=3");
    node.set_content("");
    EXPECT_EQ(text(node), "b=");
}

TEST(XmlNodeTest, CopiesAreDeep) {
    xml::node source("a", "1");
    const xml::node copy(source);
    xml::node assigned;
    assigned = source;
    source.set_name("x");
    source.set_content("y");
    EXPECT_EQ(text(copy), "a=1");
    EXPECT_EQ(text(assigned), "a=1");
    const xml::node& self = assigned;
    assigned = self;
    EXPECT_EQ(text(assigned), "a=1");
}

TEST(XmlNodeTest, SwapExchanges) {
    xml::node a("a", "1");
    xml::node b("b", "2");
    a.swap(b);
    EXPECT_EQ(text(a), "b=2");
    EXPECT_EQ(text(b), "a=1");
    swap(a, b);
    EXPECT_EQ(text(a), "a=1");
}

}  // namespace

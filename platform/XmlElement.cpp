#include "platform/XmlElement.h"

#include <algorithm>
#include <new>
#include <pugixml.hpp>

#include "QVSa/values/Text.h"

namespace QVSa::platform {

namespace {

// The document ends a text at a zero, so these have to be gone before.
String allowed(const String& text) {
  if (std::ranges::all_of(text, [](char c) { return c >= ' ' && c < 0x7F; })) return text;
  std::u16string units = toUtf16(text);
  std::erase_if(units, [](char16_t c) { return (c < 0x20 && c != '\t' && c != '\n' && c != '\r') || c >= 0xFFFE; });
  return fromUtf16(units);
}

}  // namespace

struct XmlWriter : pugi::xml_writer {
  String output;

  void write(const void* data, std::size_t size) override { output.append(static_cast<const char*>(data), size); }

  // What the library could not make it says nothing of.
  static void require(bool made) {
    if (!made) throw std::bad_alloc();
  }

  static void build(pugi::xml_node parent, const XmlElement& element) {
    pugi::xml_node node = parent.append_child(element.name_.c_str());
    require(node && element.name_ == node.name());
    for (const auto& [name, value] : element.attributes_) {
      pugi::xml_attribute attribute = node.append_attribute(name.c_str());
      require(attribute && name == attribute.name() && attribute.set_value(allowed(value).c_str()));
    }
    if (!element.content_.empty()) require(node.text().set(allowed(element.content_).c_str()));
    for (const XmlElement& child : element.children_) build(node, child);
  }
};

String XmlElement::text() const {
  pugi::xml_document document;
  XmlWriter::build(document, *this);
  XmlWriter writer;
  document.save(writer, "", pugi::format_raw | pugi::format_no_declaration, pugi::encoding_utf8);
  return writer.output;
}

}  // namespace QVSa::platform

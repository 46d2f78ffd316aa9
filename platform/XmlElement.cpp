#include "platform/XmlElement.h"

#include <pugixml.hpp>

namespace QVSa::platform {

struct XmlWriter : pugi::xml_writer {
  String output;

  void write(const void* data, std::size_t size) override { output.append(static_cast<const char*>(data), size); }

  static void build(pugi::xml_node parent, const XmlElement& element) {
    pugi::xml_node node = parent.append_child(element.name_.c_str());
    for (const auto& [name, value] : element.attributes_) node.append_attribute(name.c_str()) = value.c_str();
    if (!element.content_.empty()) node.text() = element.content_.c_str();
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

#pragma once

#include <utility>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// An element of an XML document: attributes and children in the order in which they were added.
class XmlElement {
 public:
  explicit XmlElement(String name) : name_(std::move(name)) {}

  void setAttribute(const String& name, const String& value) { attributes_.emplace_back(name, value); }
  // The element's own text; it stands before the children.
  void setText(const String& text) { content_ = text; }
  void append(XmlElement child) { children_.push_back(std::move(child)); }

  // The element as one line without a declaration: <ns><n ymd="...">AB001</n></ns>, an empty one <ns/>. Line breaks in
  // attributes are written as character references; characters that XML 1.0 forbids are left out, and bytes that are no
  // UTF-8 are written as U+FFFD.
  String text() const;

 private:
  friend struct XmlWriter;

  String name_;
  std::vector<std::pair<String, String>> attributes_;
  String content_;
  std::vector<XmlElement> children_;
};

}  // namespace QVSa::platform

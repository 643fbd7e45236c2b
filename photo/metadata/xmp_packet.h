#pragma once

#include <functional>
#include <memory>
#include <pugixml.hpp>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace pelorin::photo {

/// Why an XMP packet could not be read; `what()` is one clause for a user.
class XmpError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// A name of XMP: the address of its namespace, whatever prefix a packet gives it, and the rest.
struct XmpName {
  std::string_view space, local;
};

/// A structure that is added to a packet.
struct XmpField {
  std::string local, text;
};
struct XmpStructure {
  std::string_view space;  ///< Of all its fields.
  std::string prefix;      ///< What the packet calls it there.
  std::vector<XmpField> fields;
};

class XmpPacket;

/// A property, field or list item of a packet, in whichever of RDF's spellings it stands: attribute
/// or element, structures with parseType="Resource", a nested rdf:Description or plain attributes.
/// Belongs to its packet, which must outlive it. One made by default is no property.
class XmpProperty {
 public:
  XmpProperty() = default;
  explicit operator bool() const { return static_cast<bool>(element_); }

  /// The value without the space around it; empty for structures and lists.
  std::string text() const;
  void setText(const std::string& text);
  void remove();

  /// A field of a structure; no property where there is none.
  XmpProperty field(XmpName name) const;
  /// The items of a list (rdf:Bag, rdf:Seq, rdf:Alt), in order; none for other values.
  std::vector<XmpProperty> items() const;
  /// How many bytes the property takes, written out.
  std::size_t size() const;

 private:
  friend class XmpPacket;
  XmpProperty(pugi::xml_node element, pugi::xml_attribute attribute, bool* changed)
      : element_(element), attribute_(attribute), changed_(changed) {}

  pugi::xml_node element_;         // of an attribute: the one that it stands in
  pugi::xml_attribute attribute_;  // none in the element syntax
  bool* changed_ = nullptr;
};

/// A packet of XMP, read and edited. What no edit touches keeps its meaning; a packet that no edit
/// touches keeps its bytes.
class XmpPacket {
 public:
  /// @param bytes  UTF-8, with or without the processing instructions around it.
  /// @throws XmpError for what is not well-formed, has no RDF, declares a document type (which XMP
  ///         never does, and bombs do), is nested deeper than 100, is over 64 MiB or made of more
  ///         than a million elements and attributes, and std::bad_alloc.
  explicit XmpPacket(std::string_view bytes);
  /// A packet without properties, and without processing instructions as an extension has none.
  XmpPacket();
  /// A packet without properties that stands for itself.
  static XmpPacket ofItsOwn();

  /// A property of the packet wherever it stands: files in the wild repeat some.
  std::vector<XmpProperty> properties(XmpName name) const;
  /// The first of them; no property where there is none.
  XmpProperty property(XmpName name) const;
  /// All of them.
  std::vector<XmpProperty> properties() const;

  /// Removes the properties for which `isKept` is false.
  void keepOnly(const std::function<bool(XmpName)>& isKept);
  /// Adds a property that the packet does not have.
  /// @param prefix  for its namespace, where the packet has none for it.
  void add(XmpName name, const std::string& prefix, const std::string& text);
  /// Appends a structure to an ordered list; one is made where the packet has none.
  void append(XmpName list, const std::string& prefix, const XmpStructure& item);
  /// Moves a property of another packet here.
  void take(XmpProperty property);

  bool changed() const { return state_->changed; }
  /// The packet written out, as long as it was where the padding within allows it.
  /// @param longest  beyond which no padding is put.
  std::string bytes(std::size_t longest = std::string::npos) const;

 private:
  struct State {
    pugi::xml_document document;
    pugi::xml_node rdf;
    bool changed = false;
    std::string original;
    std::string_view before, after;  // of the original: what stands around the document
  };

  std::string rdfName(std::string_view local) const;
  pugi::xml_node addDescription();

  std::unique_ptr<State> state_;  // stays where it is, since properties point into it
};

}  // namespace pelorin::photo

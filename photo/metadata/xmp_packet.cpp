#include "photo/metadata/xmp_packet.h"

#include <algorithm>
#include <new>

namespace pelorin::photo {
namespace {

constexpr std::string_view rdfSpace = "http://www.w3.org/1999/02/22-rdf-syntax-ns#";
constexpr std::string_view whitespace = " \t\r\n";
constexpr std::string_view empty =
    "<x:xmpmeta xmlns:x=\"adobe:ns:meta/\"><rdf:RDF xmlns:rdf=\"http://www.w3.org/1999/02/"
    "22-rdf-syntax-ns#\"></rdf:RDF></x:xmpmeta>";
constexpr std::size_t mostParts = 1'000'000;
constexpr int deepest = 100;

constexpr std::size_t largestPacket = std::size_t{64} << 20;

// What a parser keeps costs 40 to 60 bytes a part, however few bytes spell it.
void checkParts(std::string_view bytes) {
  const auto parts = std::count_if(bytes.begin(), bytes.end(),
                                   [](char letter) { return letter == '<' || letter == '='; });
  if (static_cast<std::size_t>(parts) > mostParts) throw XmpError("made of too many parts");
}

class TreeCheck : public pugi::xml_tree_walker {
 public:
  bool for_each(pugi::xml_node& node) override {
    if (node.type() == pugi::node_doctype) throw XmpError("declares a document type");
    if (depth() > deepest) throw XmpError("nested too deeply");
    return true;
  }
};

// The address that a prefix stands for at an element.
std::string_view spaceOf(pugi::xml_node element, std::string_view prefix) {
  for (; element; element = element.parent()) {
    for (const pugi::xml_attribute attribute : element.attributes()) {
      const std::string_view name = attribute.name();
      if (name.substr(0, 6) == "xmlns:" && name.substr(6) == prefix) return attribute.value();
    }
  }
  return {};
}

// Compares the local part first: prefixes are looked up for few names.
bool isNamed(pugi::xml_node element, std::string_view written, XmpName name) {
  const std::size_t colon = written.find(':');
  if (colon == std::string_view::npos || written.substr(colon + 1) != name.local) return false;
  return spaceOf(element, written.substr(0, colon)) == name.space;
}

bool isRdf(pugi::xml_node element, std::string_view local) {
  return isNamed(element, element.name(), {rdfSpace, local});
}

pugi::xml_node rdfChild(pugi::xml_node element, std::string_view local) {
  return element.find_child([&](pugi::xml_node child) { return isRdf(child, local); });
}

// The parser tells of memory that it does not get by returning what is false.
template <typename T>
T allocated(T made) {
  if (!made) throw std::bad_alloc();
  return made;
}

pugi::xml_node addChild(pugi::xml_node parent, const std::string& name) {
  return allocated(parent.append_child(name.c_str()));
}

void addAttribute(pugi::xml_node element, const std::string& name, const std::string& value) {
  allocated(allocated(element.append_attribute(name.c_str())).set_value(value.c_str()));
}

void setContent(pugi::xml_node element, const std::string& text) {
  allocated(element.text().set(text.c_str()));
}

// Not a stream: those keep silent about memory that they do not get.
class TextWriter : public pugi::xml_writer {
 public:
  void write(const void* data, std::size_t size) override {
    text.append(static_cast<const char*>(data), size);
  }
  std::string text;
};

pugi::xml_node addElement(pugi::xml_node description, XmpName name, const std::string& prefix) {
  addAttribute(description, "xmlns:" + prefix, std::string(name.space));
  return addChild(description, prefix + ":" + std::string(name.local));
}

std::string trimmed(std::string_view text) {
  const std::size_t first = text.find_first_not_of(whitespace);
  if (first == std::string_view::npos) return "";
  return std::string(text.substr(first, text.find_last_not_of(whitespace) - first + 1));
}

// Where the document begins, behind processing instructions, and where it ends.
std::pair<std::size_t, std::size_t> documentWithin(std::string_view bytes) {
  std::size_t begin = 0;
  while (true) {
    const std::size_t mark = bytes.find('<', begin);
    if (mark == std::string_view::npos || bytes.substr(mark, 2) != "<?") break;
    const std::size_t end = bytes.find("?>", mark);
    if (end == std::string_view::npos) break;
    begin = end + 2;
  }
  std::size_t end = bytes.rfind("<?xpacket end");
  if (end == std::string_view::npos || end < begin) end = bytes.size();
  while (end > begin && (bytes[end - 1] == '\0' || whitespace.find(bytes[end - 1]) < 4)) --end;
  return {begin, end};
}

}  // namespace

std::string XmpProperty::text() const {
  if (attribute_) return trimmed(attribute_.value());
  if (const XmpProperty qualified = field({rdfSpace, "value"})) return qualified.text();
  return trimmed(element_.text().get());
}

void XmpProperty::setText(const std::string& text) {
  if (!attribute_) {
    if (XmpProperty qualified = field({rdfSpace, "value"})) return qualified.setText(text);
  }
  if (this->text() == text) return;
  *changed_ = true;
  if (attribute_) {
    allocated(attribute_.set_value(text.c_str()));
  } else {
    setContent(element_, text);
  }
}

void XmpProperty::remove() {
  if (!element_) return;
  *changed_ = true;
  if (attribute_) {
    element_.remove_attribute(attribute_);
  } else {
    element_.parent().remove_child(element_);
  }
  *this = {};
}

XmpProperty XmpProperty::field(XmpName name) const {
  if (attribute_) return {};
  for (const pugi::xml_node holder : {element_, rdfChild(element_, "Description")}) {
    for (const pugi::xml_attribute attribute : holder.attributes()) {
      if (isNamed(holder, attribute.name(), name)) return {holder, attribute, changed_};
    }
    for (const pugi::xml_node child : holder.children()) {
      if (isNamed(child, child.name(), name)) return {child, {}, changed_};
    }
  }
  return {};
}

std::vector<XmpProperty> XmpProperty::items() const {
  std::vector<XmpProperty> found;
  if (attribute_) return found;
  for (const std::string_view kind : {"Bag", "Seq", "Alt"}) {
    for (const pugi::xml_node item : rdfChild(element_, kind).children()) {
      if (isRdf(item, "li")) found.push_back({item, {}, changed_});
    }
  }
  return found;
}

std::size_t XmpProperty::size() const {
  if (attribute_) {
    return std::string_view(attribute_.name()).size() +
           std::string_view(attribute_.value()).size() + 4;
  }
  TextWriter writer;
  element_.print(writer, "", pugi::format_raw);
  return writer.text.size();
}

XmpPacket::XmpPacket(std::string_view bytes) : state_(std::make_unique<State>()) {
  if (bytes.size() > largestPacket) throw XmpError("over 64 MiB");
  checkParts(bytes);
  state_->original = bytes;
  const std::string_view all = state_->original;
  const auto [begin, end] = documentWithin(all);
  state_->before = all.substr(0, begin);
  state_->after = all.substr(end);
  constexpr unsigned everything = pugi::parse_default | pugi::parse_ws_pcdata | pugi::parse_pi |
                                  pugi::parse_comments | pugi::parse_doctype;
  pugi::xml_document& document = state_->document;
  const pugi::xml_parse_result result =
      document.load_buffer(all.data() + begin, end - begin, everything, pugi::encoding_utf8);
  if (result.status == pugi::status_out_of_memory) throw std::bad_alloc();
  if (!result) throw XmpError("not well-formed XML");
  TreeCheck check;
  document.traverse(check);
  pugi::xml_node root = document.document_element();
  if (!isRdf(root, "RDF")) root = rdfChild(root, "RDF");
  if (!root) throw XmpError("without RDF");
  state_->rdf = root;
}

XmpPacket::XmpPacket() : XmpPacket(empty) {}

XmpPacket XmpPacket::ofItsOwn() {
  // The mark of the byte order is part of the beginning's definition.
  return XmpPacket("<?xpacket begin=\"\xEF\xBB\xBF\" id=\"W5M0MpCehiHzreSzNTczkc9d\"?>" +
                   std::string(empty) + "<?xpacket end=\"w\"?>");
}

std::string XmpPacket::rdfName(std::string_view local) const {
  const std::string_view root = state_->rdf.name();
  return std::string(root.substr(0, root.find(':') + 1)) += local;
}

// One of its own for what is added, so that prefixes collide with no others.
pugi::xml_node XmpPacket::addDescription() {
  pugi::xml_node description = addChild(state_->rdf, rdfName("Description"));
  // All descriptions of a packet are about the same.
  const std::string about = rdfName("about");
  const pugi::xml_node first = rdfChild(state_->rdf, "Description");
  addAttribute(description, about, first.attribute(about.c_str()).value());
  return description;
}

std::vector<XmpProperty> XmpPacket::properties() const {
  std::vector<XmpProperty> found;
  for (const pugi::xml_node description : state_->rdf.children()) {
    if (!isRdf(description, "Description")) continue;
    for (const pugi::xml_attribute attribute : description.attributes()) {
      const std::string_view name = attribute.name();
      const bool ofRdf = spaceOf(description, name.substr(0, name.find(':'))) == rdfSpace;
      if (name.substr(0, 5) == "xmlns" || name.find(':') == std::string_view::npos || ofRdf)
        continue;
      found.push_back({description, attribute, &state_->changed});
    }
    for (const pugi::xml_node child : description.children()) {
      if (child.type() == pugi::node_element) found.push_back({child, {}, &state_->changed});
    }
  }
  return found;
}

std::vector<XmpProperty> XmpPacket::properties(XmpName name) const {
  std::vector<XmpProperty> found;
  for (const pugi::xml_node description : state_->rdf.children()) {
    if (!isRdf(description, "Description")) continue;
    for (const pugi::xml_attribute attribute : description.attributes()) {
      if (isNamed(description, attribute.name(), name))
        found.push_back({description, attribute, &state_->changed});
    }
    for (const pugi::xml_node child : description.children()) {
      if (isNamed(child, child.name(), name)) found.push_back({child, {}, &state_->changed});
    }
  }
  return found;
}

XmpProperty XmpPacket::property(XmpName name) const {
  const std::vector<XmpProperty> found = properties(name);
  return found.empty() ? XmpProperty() : found.front();
}

void XmpPacket::keepOnly(const std::function<bool(XmpName)>& isKept) {
  for (XmpProperty& property : properties()) {
    const std::string_view written =
        property.attribute_ ? property.attribute_.name() : property.element_.name();
    const std::size_t colon = std::min(written.find(':'), written.size());
    const std::string_view space = spaceOf(property.element_, written.substr(0, colon));
    if (!isKept({space, written.substr(std::min(colon + 1, written.size()))})) property.remove();
  }
}

void XmpPacket::add(XmpName name, const std::string& prefix, const std::string& text) {
  setContent(addElement(addDescription(), name, prefix), text);
  state_->changed = true;
}

void XmpPacket::append(XmpName list, const std::string& prefix, const XmpStructure& item) {
  pugi::xml_node owner = property(list).element_;
  const bool isList = owner && !property(list).attribute_;
  if (!isList) owner = addElement(addDescription(), list, prefix);
  pugi::xml_node sequence = rdfChild(owner, "Seq");
  if (!sequence) sequence = addChild(owner, rdfName("Seq"));
  pugi::xml_node written = addChild(sequence, rdfName("li"));
  addAttribute(written, "xmlns:" + item.prefix, std::string(item.space));
  addAttribute(written, rdfName("parseType"), "Resource");
  for (const XmpField& field : item.fields)
    setContent(addChild(written, item.prefix + ":" + field.local), field.text);
  state_->changed = true;
}

void XmpPacket::take(XmpProperty property) {
  pugi::xml_node source = property.element_;
  pugi::xml_node description = addDescription();
  // Every prefix that the property can see; the nearest meaning of each.
  for (pugi::xml_node scope = property.attribute_ ? source : source.parent(); scope;
       scope = scope.parent()) {
    for (const pugi::xml_attribute attribute : scope.attributes()) {
      const std::string_view name = attribute.name();
      if (name.substr(0, 6) == "xmlns:" && !description.attribute(attribute.name()))
        allocated(description.append_copy(attribute));
    }
  }
  if (property.attribute_) {
    allocated(description.append_copy(property.attribute_));
  } else {
    allocated(description.append_copy(source));
  }
  state_->changed = true;
  property.remove();
}

std::string XmpPacket::bytes(std::size_t longest) const {
  const auto& [document, rdf, changed, original, before, after] = *state_;
  if (!changed && original.size() <= longest) return original;
  TextWriter writer;
  document.save(writer, "", pugi::format_raw | pugi::format_no_declaration, pugi::encoding_utf8);
  const std::string& written = writer.text;
  // Padding is the space before the closing instruction; programs write into it.
  const std::size_t padding = std::min(after.find_first_not_of(whitespace), after.size());
  const std::size_t others = before.size() + after.size() - padding;
  const std::size_t room =
      std::max(std::min(original.size(), longest), others + written.size()) - others;
  std::string_view fill = after.substr(0, padding);
  std::string result(before);
  result += written;
  if (padding == 0) return result += after;
  const std::size_t wanted = room - written.size();
  if (wanted <= fill.size()) {
    result += fill.substr(fill.size() - wanted);
  } else {
    result += std::string(wanted - fill.size(), ' ');
    result += fill;
  }
  return result += after.substr(padding);
}

}  // namespace pelorin::photo

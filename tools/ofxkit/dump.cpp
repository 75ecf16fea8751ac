// ofxkit dump: the object tree of an OFX file and the warnings of its parse.
#include <cstdio>
#include <nlohmann/json.hpp>
#include <string>

#include "charset.h"
#include "cli.h"

namespace cli {
namespace {

const char kDumpHelp[] =
    "usage: ofxkit dump [--json] FILE\n"
    "Parses an OFX request or response file and prints its object tree, then the\n"
    "warnings of the parse (code, tag, value, position). Passwords are never shown.\n"
    "  --json   print the same as one JSON document\n"
    "Exit status: 0 clean parse, 1 parsed with warnings, 2 parse failed, 3 unreadable\n"
    "or not OFX, 64 bad command line.\n";

// The file's text as UTF-8 (set while a dump runs).
Utf8Converter* g_text = nullptr;

std::string Utf8(const char* text, const char* field) { return g_text ? (*g_text)(text, field) : text; }

// One element value of an object, as the tree shows it.
struct Element {
  OETagID tag;
  std::string value;
};

// The present elements of an object, in writing order (passwords hidden).
std::vector<Element> ElementsOf(const OEDataObj* obj) {
  std::vector<Element> out;
  const OEAggregate* agg = dynamic_cast<const OEAggregate*>(obj);
  if (!agg) return out;
  const OEAggregateInfo& info = agg->GetInfo();
  OEString text;
  for (size_t i = 0; i < info.writeList.size(); ++i) {
    const OEFieldDesc* d = info.writeList[i];
    OETagID tag = info.writeTags[i];
    if (!d->text || !agg->ValidateTag(tag)) continue;
    unsigned short n = d->count ? d->count(agg) : 1;
    for (unsigned short k = 0; k < n; ++k) {
      if (tag == OE_TAG_USERPASS || tag == OE_TAG_NEWUSERPASS) {
        out.push_back({tag, "(hidden)"});
      } else if (d->text(agg, k, text)) {
        out.push_back({tag, Utf8(text.c_str(), TagName(tag))});
      }
    }
  }
  return out;
}

const char* HeaderName(int32_t h) { return OEDataConversion::Text(static_cast<OEHeaderTag>(h)); }

void HeadersOf(const OEDataObj* obj, std::vector<Element>& out) {
  const OEFileOFX* file = dynamic_cast<const OEFileOFX*>(obj);
  if (!file) return;
  for (int32_t h = OE_HEADER_OFXHEADER; h <= OE_HEADER_NEWFILEUID; ++h)
    if (const OEString* value = file->GetHeader(static_cast<OEHeaderTag>(h)))
      out.push_back({static_cast<OETagID>(h), Utf8(value->c_str(), HeaderName(h))});
}

void DumpText(const OEDataObj* obj, int depth, FILE* out) {
  std::string indent(static_cast<size_t>(depth) * 2, ' ');
  std::fprintf(out, "%s%s\n", indent.c_str(), TagName(obj->GetType()));
  std::vector<Element> headers;
  HeadersOf(obj, headers);
  for (const Element& h : headers)
    std::fprintf(out, "%s  %s:%s\n", indent.c_str(), HeaderName(h.tag), h.value.c_str());
  for (const Element& e : ElementsOf(obj))
    std::fprintf(out, "%s  %s = %s\n", indent.c_str(), TagName(e.tag), e.value.c_str());
  unsigned short n = obj->GetNumberOfChildren();
  for (unsigned short i = 0; i < n; ++i)
    if (const OEDataObj* child = obj->GetChild(i)) DumpText(child, depth + 1, out);
}

// Streams the tree as JSON, one object at a time, so a large statement does
// not need its whole JSON document in memory.
void DumpJson(const OEDataObj* obj, FILE* out) {
  std::fprintf(out, "{\"type\":%s", nlohmann::json(TagName(obj->GetType())).dump().c_str());
  std::vector<Element> headers;
  HeadersOf(obj, headers);
  if (!headers.empty()) {
    nlohmann::ordered_json h = nlohmann::ordered_json::object();
    for (const Element& e : headers) h[HeaderName(e.tag)] = e.value;
    std::fprintf(out, ",\"headers\":%s", h.dump().c_str());
  }
  std::vector<Element> elements = ElementsOf(obj);
  if (!elements.empty()) {
    nlohmann::ordered_json els = nlohmann::ordered_json::object();
    for (const Element& e : elements) {
      const char* name = TagName(e.tag);
      if (!els.contains(name))
        els[name] = e.value;
      else if (els[name].is_array())
        els[name].push_back(e.value);
      else
        els[name] = nlohmann::ordered_json::array({els[name], e.value});
    }
    std::fprintf(out, ",\"elements\":%s", els.dump(-1, ' ', false, nlohmann::ordered_json::error_handler_t::replace).c_str());
  }
  unsigned short n = obj->GetNumberOfChildren();
  bool first = true;
  for (unsigned short i = 0; i < n; ++i) {
    const OEDataObj* child = obj->GetChild(i);
    if (!child) continue;
    std::fprintf(out, first ? ",\"children\":[" : ",");
    first = false;
    DumpJson(child, out);
  }
  if (!first) std::fprintf(out, "]");
  std::fprintf(out, "}");
}

nlohmann::json WarningJson(const OEParseException& w) {
  return {{"code", OEParseException::WarningName(w.warning)},
          {"tag", w.tag ? TagName(w.tag) : Utf8(w.tagName.c_str(), "a warning")},
          {"value", Utf8(w.value.c_str(), "a warning")},
          {"position", w.position}};
}

}  // namespace

int CmdDump(int argc, char** argv) {
  Args args(argc, argv, 2);
  if (args.Flag("help")) {
    std::fputs(kDumpHelp, stdout);
    return kClean;
  }
  bool json = args.Flag("json");
  std::string error;
  std::vector<std::string> files = args.Positional(&error);
  if (!error.empty() || files.size() != 1) {
    std::fprintf(stderr, "ofxkit dump: %s\n%s", error.empty() ? "expected one FILE" : error.c_str(), kDumpHelp);
    return kUsage;
  }
  ParsedFile parsed;
  int rc = ParseOFXFile(files[0], parsed, &error);
  if (rc == kBadInput) {
    std::fprintf(stderr, "ofxkit dump: %s\n", error.c_str());
    return rc;
  }
  Utf8Converter text(CharsetOf(*parsed.file));
  g_text = &text;
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  if (json) {
    std::fprintf(stdout, "{\"status\":%d,\"tree\":", static_cast<int>(parsed.status));
    DumpJson(parsed.file.get(), stdout);
    std::fprintf(stdout, ",\"warnings\":[");
    for (unsigned short i = 0; i < log->Entries(); ++i)
      std::fprintf(stdout, "%s%s", i ? "," : "", WarningJson(*log->Get(i)).dump(-1, ' ', false,
                                                                          nlohmann::ordered_json::error_handler_t::replace).c_str());
    std::fprintf(stdout, "]}\n");
  } else {
    DumpText(parsed.file.get(), 0, stdout);
    std::fprintf(stdout, "parse status %d, %u warning(s)\n", static_cast<int>(parsed.status),
                 static_cast<unsigned>(log->Entries()));
    for (unsigned short i = 0; i < log->Entries(); ++i) {
      const OEParseException* w = log->Get(i);
      std::fprintf(stdout, "  %s tag=%s value=\"%s\" position=%d\n", OEParseException::WarningName(w->warning),
                   w->tag ? TagName(w->tag) : Utf8(w->tagName.c_str(), "a warning").c_str(),
                   Utf8(w->value.c_str(), "a warning").c_str(), static_cast<int>(w->position));
    }
  }
  g_text = nullptr;
  if (!text.Report().empty()) std::fprintf(stderr, "ofxkit dump: %s\n", text.Report().c_str());
  return rc;
}

}  // namespace cli

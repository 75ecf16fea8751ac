// An audit of a parse: what the text of an OFX file holds that the tree made
// from it does not.
//
// The parser repairs what it can and goes on (unknown tags are skipped, a
// repeated single element replaces the earlier value, nothing after the last
// </OFX> is read, a tag that lacks its '>' swallows what follows). Each such
// rule is reasonable on its own, but together they can drop a transaction
// without a single warning. The audit reads the text once more with the parse
// engine's own lexical rules and compares it with the tree: for every
// aggregate that holds money or identity it counts the start tags in the text
// and the objects in the tree, and it looks for the constructs that make the
// lexer swallow text (tags with '<' or a line end inside them, CDATA sections
// that run over tags, a NUL byte that ends the text early, another OFX
// aggregate after the last one read).
//
// It costs one more pass of the engine over the text and a walk of the tree;
// it logs nothing and changes neither the text nor the tree.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "ofxkit/core/OETagID.h"

class OEBuffer;
class OEDataObj;

namespace ofxkit {

enum class AuditKind {
  kMissing,      // fewer objects in the tree than start tags in the text
  kSurplus,      // more objects in the tree than start tags in the text
  kReplaced,     // a single element or child given more than once in one aggregate
  kBrokenTag,    // a tag with '<' or a line end inside it: its '>' is missing
  kCDataOverTags,  // a CDATA section whose text holds OFX tags
  kOFXAfterEnd,  // an OFX aggregate after the end of the last one read
  kTextAfterNul  // the text stops at a NUL byte before the end of the data
};

struct AuditFinding {
  AuditKind kind = AuditKind::kMissing;
  // The aggregate counted (kMissing, kSurplus, kOFXAfterEnd), the tag that is
  // broken (kBrokenTag) or the element or child given again (kReplaced).
  OETagID tag = OE_TAG_NONE;
  // The tag's name: the dictionary's, or for an unknown tag as written.
  std::string name;
  // kReplaced: the aggregate in which it was given again.
  OETagID parent = OE_TAG_NONE;
  // kMissing, kSurplus, kOFXAfterEnd: start tags in the text, objects in the tree.
  uint32_t inText = 0;
  uint32_t inTree = 0;
  // How many places this finding stands for (kReplaced, kBrokenTag, kCDataOverTags).
  uint32_t occurrences = 1;
  // Byte offset in the text of the first place concerned: for kMissing the
  // start tag just after as many as the tree holds; -1 when there is none.
  int32_t position = -1;
  // kBrokenTag, kCDataOverTags, kTextAfterNul: where the swallowed text ends.
  int32_t until = -1;

  // Whether data of the file is missing from the tree (every kind but kSurplus).
  bool IsLoss() const { return kind != AuditKind::kSurplus; }
  // One line, for people: "3 of 6 STMTTRN in the file were not read: ...".
  std::string Describe() const;
};

struct AuditReport {
  std::vector<AuditFinding> findings;
  uint32_t tagsInText = 0;  // start and end tags read from the text
  bool complete = true;     // false when memory ran out during the audit
  bool HasLoss() const;
};

// The aggregates whose start tags and objects are counted: statements and
// their transactions, positions, balances, securities, open orders, accounts,
// and the message sets and wrappers that hold them, and OFX itself.
const std::vector<OETagID>& AuditedAggregates();

// Compares the text of a file with the tree that a parse of it gave (root is
// the object handed to the parser, usually an OEFileRs or OEFileRq).
AuditReport AuditParse(const OEBuffer& text, const OEDataObj& root);

}  // namespace ofxkit

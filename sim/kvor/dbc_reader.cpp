#include "dbc_reader.h"

#include <charconv>
#include <map>
#include <optional>
#include <set>
#include <utility>

#include "dbc_attribute_values.h"
#include "dbc_attributes.h"
#include "dbc_tokens.h"
#include "signal_codec.h"

namespace nKvorSim {

namespace {

using Kind = tDbcToken::Kind;

// The words that begin statements, which can name no node.
bool IsStatementWord(const std::string &word) {
  static const char *const kWords[] = {
      "VERSION", "NS_", "BS_", "BU_", "BO_", "SG_", "CM_", "VAL_", "VAL_TABLE_", "BA_DEF_",
      "BA_DEF_DEF_", "BA_", "SIG_VALTYPE_", "EV_", "BO_TX_BU_", "SIG_GROUP_", "SGTYPE_",
      "SG_MUL_VAL_", "BA_DEF_REL_", "BA_REL_", "BA_DEF_DEF_REL_", "ENVVAR_DATA_", "CAT_DEF_",
      "CAT_", "FILTER", "SIG_TYPE_REF_", "SIGTYPE_VALTYPE_", "BA_DEF_SGTYPE_", "BA_SGTYPE_"};
  for (const char *known : kWords) {
    if (word == known) return true;
  }
  return false;
}

[[noreturn]] void Fail(uint32_t line, std::string message) {
  throw tDbcSyntaxError{line, std::move(message)};
}

class cDbcParser {
 public:
  cDbcParser(std::string_view text, tDatabase *database, std::vector<tDbcError> *warnings)
      : lexer_(text), database_(database), warnings_(warnings) {}

  void Run();

 private:
  // Takes the next token, which must be of `kind` (and, for punctuation, be `punctuation`). A
  // statement that lives on one line passes its line as `line`: its next token must then start
  // where the one before it ended, or the line ended early. (A string may run over lines.)
  tDbcToken Take(Kind kind, const char *what, uint32_t line = 0, char punctuation = 0);
  bool PeekPunctuation(char c);
  // Takes the ';' that ends a statement. Files of other tools leave it out at the end of a line;
  // a next statement that starts a line of its own ends the statement all the same.
  void EndStatement(const char *what);
  void Warn(uint32_t line, std::string message);
  // Whether the next token goes on the line where the last one ended.
  bool OnLine();

  uint32_t ToU32(const tDbcToken &token, const char *what);
  double ToDouble(const tDbcToken &token, const char *what);
  uint64_t ToBaudRate(const tDbcToken &token);

  void ReadVersion(uint32_t line);
  void SkipSymbolList();
  void ReadNodes(uint32_t line);
  void ReadFrame(uint32_t line);
  void ReadSignal(uint32_t line);
  void ReadComment(uint32_t line);
  void ReadValueNames(uint32_t line);
  void ReadValueTable(uint32_t line);
  void ReadAttributeDefinition(uint32_t line);
  void ReadAttributeDefault(uint32_t line);
  void ReadAttribute(uint32_t line);
  void ReadSignalType(uint32_t line);
  void SkipStatement(uint32_t line);
  void Finish();

  std::vector<tValueName> ReadValuePairs(uint32_t line);
  // The objects that a statement is about; null for one that the file does not define, whose
  // statement then describes nothing and is dropped, as files from the field need.
  tFrame *FrameOf(const tDbcToken &id);
  tSignal *SignalOf(const tDbcToken &id, const tDbcToken &name);
  tEcu *EcuOf(const tDbcToken &name);
  tAttributeDefinition *DefinitionOf(const std::string &name);

  cDbcLexer lexer_;
  tDatabase *database_;
  tCluster *cluster_ = nullptr;
  tFrame *currentFrame_ = nullptr;  // the frame whose signals may follow
  std::map<uint32_t, tFrame *> framesById_;  // by the identifier as the file writes it
  std::map<const tFrame *, uint32_t> frameLines_;
  std::map<const tSignal *, uint32_t> signalLines_;
  std::vector<tDbcError> *warnings_;
  std::set<const tFrame *> cycleTimeSet_;
  std::set<const tSignal *> startValueSet_;
  std::optional<double> defaultCycleTime_;
  std::optional<double> defaultStartValue_;
};

tDbcToken cDbcParser::Take(Kind kind, const char *what, uint32_t line, char punctuation) {
  const uint32_t previous = lexer_.LastLine();
  tDbcToken token = lexer_.Next();
  if (token.kind == Kind::kEnd) Fail(previous, std::string("the text ends before ") + what);
  if (line != 0 && token.line != previous) {
    Fail(previous, std::string("the line ends before ") + what);
  }
  if (token.kind != kind || (punctuation != 0 && token.text[0] != punctuation)) {
    Fail(token.line, std::string("expected ") + what + ", found " + DescribeToken(token));
  }
  if (kind == Kind::kIdentifier && token.text[0] >= '0' && token.text[0] <= '9') {
    Warn(token.line, "name '" + token.text + "' starts with a digit");
  }
  return token;
}

bool cDbcParser::PeekPunctuation(char c) {
  const tDbcToken &token = lexer_.Peek();
  return token.kind == Kind::kPunctuation && token.text[0] == c;
}

void cDbcParser::Warn(uint32_t line, std::string message) {
  if (warnings_ != nullptr) warnings_->push_back(tDbcError{line, std::move(message)});
}

void cDbcParser::EndStatement(const char *what) {
  if (PeekPunctuation(';')) {
    lexer_.Next();
    return;
  }
  const tDbcToken &next = lexer_.Peek();
  const uint32_t line = lexer_.LastLine();
  if (next.kind == Kind::kEnd ||
      (next.kind == Kind::kIdentifier && next.line != line && next.column == 0 &&
       IsStatementWord(next.text))) {
    Warn(line, std::string("no ';' ") + what);
    return;
  }
  Take(Kind::kPunctuation, (std::string("';' ") + what).c_str(), 0, ';');
}

bool cDbcParser::OnLine() {
  const tDbcToken &token = lexer_.Peek();
  return token.kind != Kind::kEnd && token.line == lexer_.LastLine();
}

uint32_t cDbcParser::ToU32(const tDbcToken &token, const char *what) {
  uint32_t value = 0;
  const char *first = token.text.data();
  const char *last = first + token.text.size();
  const auto result = std::from_chars(first, last, value);
  if (result.ec != std::errc() || result.ptr != last) {
    Fail(token.line, std::string("bad ") + what + " '" + token.text + "'");
  }
  return value;
}

double cDbcParser::ToDouble(const tDbcToken &token, const char *what) {
  const char *first = token.text.data();
  const char *last = first + token.text.size();
  if (first != last && *first == '+') ++first;
  double value = 0;
  const auto result = std::from_chars(first, last, value);
  if (result.ec != std::errc() || result.ptr != last) {
    Fail(token.line, std::string("bad ") + what + " '" + token.text + "'");
  }
  return value;
}

uint64_t cDbcParser::ToBaudRate(const tDbcToken &token) {
  const double value = ToDouble(token, "baud rate");
  // Whole bits per second, within what any bus could run at.
  if (!(value >= 0.0 && value <= 1e12) || value != static_cast<double>(static_cast<uint64_t>(value))) {
    Fail(token.line, "bad baud rate '" + token.text + "'");
  }
  return static_cast<uint64_t>(value);
}

void cDbcParser::Run() {
  *database_ = tDatabase{};
  cluster_ = &database_->clusters.emplace_back();
  for (;;) {
    const tDbcToken keyword = lexer_.Next();
    if (keyword.kind == Kind::kEnd) break;
    if (keyword.kind != Kind::kIdentifier) {
      Fail(keyword.line, "expected a statement, found " + DescribeToken(keyword));
    }
    const std::string &word = keyword.text;
    const uint32_t line = keyword.line;
    if (word == "SG_") {
      ReadSignal(line);
      continue;
    }
    currentFrame_ = nullptr;
    if (word == "VERSION") {
      ReadVersion(line);
    } else if (word == "NS_") {
      SkipSymbolList();
    } else if (word == "BU_") {
      ReadNodes(line);
    } else if (word == "BO_") {
      ReadFrame(line);
    } else if (word == "CM_") {
      ReadComment(line);
    } else if (word == "VAL_") {
      ReadValueNames(line);
    } else if (word == "VAL_TABLE_") {
      ReadValueTable(line);
    } else if (word == "BA_DEF_") {
      ReadAttributeDefinition(line);
    } else if (word == "BA_DEF_DEF_") {
      ReadAttributeDefault(line);
    } else if (word == "BA_") {
      ReadAttribute(line);
    } else if (word == "SIG_VALTYPE_") {
      ReadSignalType(line);
    } else {
      SkipStatement(line);
    }
  }
  Finish();
}

void cDbcParser::ReadVersion(uint32_t line) {
  database_->version = Take(Kind::kString, "the version string", line).text;
}

// The list of symbols that the file may use names statements, not data; it runs on to the next
// line that starts at its first column.
void cDbcParser::SkipSymbolList() {
  Take(Kind::kPunctuation, "':' after NS_", 0, ':');
  while (lexer_.Peek().kind != Kind::kEnd && lexer_.Peek().column != 0) lexer_.Next();
}

// The node names follow on the same line, or on the indented lines after it.
void cDbcParser::ReadNodes(uint32_t line) {
  Take(Kind::kPunctuation, "':' after BU_", line, ':');
  for (;;) {
    const tDbcToken &next = lexer_.Peek();
    if (next.kind != Kind::kIdentifier || (next.line != line && next.column == 0) ||
        IsStatementWord(next.text)) {
      break;
    }
    const tDbcToken name = lexer_.Next();
    // A node listed twice is still one node.
    if (EcuOf(name) == nullptr) cluster_->ecus.emplace_back().name = name.text;
  }
}

void cDbcParser::ReadFrame(uint32_t line) {
  const tDbcToken idToken = Take(Kind::kNumber, "the frame identifier", line);
  const uint32_t written = ToU32(idToken, "frame identifier");
  const tDbcToken name = Take(Kind::kIdentifier, "the frame name", line);
  Take(Kind::kPunctuation, "':' after the frame name", line, ':');
  const uint32_t length = ToU32(Take(Kind::kNumber, "the payload length", line), "payload length");
  std::string transmitter;
  if (OnLine()) transmitter = Take(Kind::kIdentifier, "the transmitting node", line).text;
  if (OnLine()) Fail(line, "unexpected " + DescribeToken(lexer_.Peek()) + " after the frame");

  tFrame frame;
  frame.name = name.text;
  frame.id = written & MaxFrameId(true);
  frame.idMarks = written & 0x60000000u;
  // Bit 31 marks an extended identifier; some tools leave it out when the identifier needs
  // more than 11 bits anyway.
  frame.extended = (written & 0x80000000u) != 0 || (frame.idMarks != 0 && frame.id > MaxFrameId(false));
  if (frame.id > MaxFrameId(frame.extended)) {
    Fail(line, "frame identifier " + idToken.text + " is out of range");
  }
  if (!IsValidPayloadLength(length)) Fail(line, "payload length " + std::to_string(length) + " is not valid");
  frame.payloadLength = length;
  frame.format = length > 8 ? FrameFormat::kCanFd : FrameFormat::kCan;
  if (transmitter != kNoNode) frame.transmitter = transmitter;
  if (framesById_.count(written) != 0) Fail(line, "frame identifier " + idToken.text + " is used twice");
  for (const tFrame &other : cluster_->frames) {
    if (other.name == frame.name) Fail(line, "frame '" + frame.name + "' is defined twice");
  }
  currentFrame_ = &cluster_->frames.emplace_back(std::move(frame));
  framesById_[written] = currentFrame_;
  frameLines_[currentFrame_] = line;
}

void cDbcParser::ReadSignal(uint32_t line) {
  if (currentFrame_ == nullptr) Fail(line, "a signal that follows no frame");
  tSignal signal;
  signal.name = Take(Kind::kIdentifier, "the signal name", line).text;
  if (!PeekPunctuation(':')) {
    const tDbcToken mux = Take(Kind::kIdentifier, "a multiplexer mark or ':'", line);
    const std::string &m = mux.text;
    if (m == "M") {
      signal.mux = MuxRole::kMultiplexer;
    } else if (m.size() > 1 && m[0] == 'm' && m.find_first_not_of("0123456789", 1) == std::string::npos) {
      signal.mux = MuxRole::kMultiplexed;
      tDbcToken digits = mux;
      digits.text = m.substr(1);
      signal.muxValue = ToU32(digits, "multiplexer value");
    } else if (m.size() > 1 && m[0] == 'm' && m.back() == 'M') {
      Fail(line, "signal '" + signal.name + "' is multiplexed on more than one level");
    } else {
      Fail(line, "bad multiplexer mark '" + m + "'");
    }
  }
  Take(Kind::kPunctuation, "':' after the signal name", line, ':');
  signal.startBit = ToU32(Take(Kind::kNumber, "the start bit", line), "start bit");
  Take(Kind::kPunctuation, "'|' after the start bit", line, '|');
  signal.numBits = ToU32(Take(Kind::kNumber, "the bit count", line), "bit count");
  Take(Kind::kPunctuation, "'@' before the byte order", line, '@');
  const tDbcToken order = Take(Kind::kNumber, "the byte order", line);
  if (order.text != "0" && order.text != "1") Fail(line, "bad byte order '" + order.text + "'");
  signal.byteOrder = order.text == "1" ? ByteOrder::kLittleEndian : ByteOrder::kBigEndian;
  const tDbcToken sign = Take(Kind::kPunctuation, "'+' or '-' after the byte order", line);
  if (sign.text != "+" && sign.text != "-") Fail(line, "bad sign '" + sign.text + "'");
  signal.type = sign.text == "-" ? SignalType::kSigned : SignalType::kUnsigned;
  Take(Kind::kPunctuation, "'(' before the scale", line, '(');
  signal.scale = ToDouble(Take(Kind::kNumber, "the scale", line), "scale");
  Take(Kind::kPunctuation, "',' after the scale", line, ',');
  signal.offset = ToDouble(Take(Kind::kNumber, "the offset", line), "offset");
  Take(Kind::kPunctuation, "')' after the offset", line, ')');
  Take(Kind::kPunctuation, "'[' before the minimum", line, '[');
  signal.minimum = ToDouble(Take(Kind::kNumber, "the minimum", line), "minimum");
  Take(Kind::kPunctuation, "'|' after the minimum", line, '|');
  signal.maximum = ToDouble(Take(Kind::kNumber, "the maximum", line), "maximum");
  Take(Kind::kPunctuation, "']' after the maximum", line, ']');
  signal.unit = Take(Kind::kString, "the unit", line).text;
  while (OnLine()) {
    if (PeekPunctuation(',')) lexer_.Next();  // receivers are cut by commas, blanks or both
    const std::string receiver = Take(Kind::kIdentifier, "a receiving node", line).text;
    if (receiver != kNoNode) signal.receivers.push_back(receiver);
  }

  if (signal.numBits < 1 || signal.numBits > 64) {
    Fail(line, "signal '" + signal.name + "' has " + std::to_string(signal.numBits) + " bits");
  }
  if (!SignalFits(signal, currentFrame_->payloadLength)) {
    Fail(line, "signal '" + signal.name + "' does not fit in the payload of its frame");
  }
  if (FindSignal(*currentFrame_, signal.name) != nullptr) {
    Fail(line, "signal '" + signal.name + "' is defined twice in its frame");
  }
  if (signal.mux == MuxRole::kMultiplexer && FindMultiplexer(*currentFrame_) != nullptr) {
    Fail(line, "a second multiplexer in the frame");
  }
  signalLines_[&currentFrame_->signals.emplace_back(std::move(signal))] = line;
}

tFrame *cDbcParser::FrameOf(const tDbcToken &id) {
  const auto found = framesById_.find(ToU32(id, "frame identifier"));
  return found == framesById_.end() ? nullptr : found->second;
}

tSignal *cDbcParser::SignalOf(const tDbcToken &id, const tDbcToken &name) {
  tFrame *frame = FrameOf(id);
  if (frame == nullptr) return nullptr;
  for (tSignal &signal : frame->signals) {
    if (signal.name == name.text) return &signal;
  }
  return nullptr;
}

tEcu *cDbcParser::EcuOf(const tDbcToken &name) {
  for (tEcu &ecu : cluster_->ecus) {
    if (ecu.name == name.text) return &ecu;
  }
  return nullptr;
}

void cDbcParser::ReadComment(uint32_t line) {
  std::string *target = &cluster_->comment;
  const tDbcToken &next = lexer_.Peek();
  if (next.kind == Kind::kIdentifier) {
    const std::string kind = lexer_.Next().text;
    if (kind == "BU_") {
      tEcu *ecu = EcuOf(Take(Kind::kIdentifier, "the node name"));
      target = ecu != nullptr ? &ecu->comment : nullptr;
    } else if (kind == "BO_") {
      tFrame *frame = FrameOf(Take(Kind::kNumber, "the frame identifier"));
      target = frame != nullptr ? &frame->comment : nullptr;
    } else if (kind == "SG_") {
      const tDbcToken id = Take(Kind::kNumber, "the frame identifier");
      tSignal *signal = SignalOf(id, Take(Kind::kIdentifier, "the signal name"));
      target = signal != nullptr ? &signal->comment : nullptr;
    } else if (kind == "EV_") {
      Take(Kind::kIdentifier, "the variable name");
      target = nullptr;
    } else {
      Fail(line, "comment on an unknown kind of object '" + kind + "'");
    }
  }
  const std::string text = Take(Kind::kString, "the comment text").text;
  if (target != nullptr) *target = text;
  EndStatement("after the comment");
}

std::vector<tValueName> cDbcParser::ReadValuePairs(uint32_t line) {
  std::vector<tValueName> values;
  for (;;) {
    const tDbcToken &next = lexer_.Peek();
    if (next.kind == Kind::kEnd) Fail(line, "the value list is not closed with ';'");
    if (next.kind == Kind::kPunctuation && next.text[0] == ';') break;
    tValueName pair;
    pair.value = ToDouble(Take(Kind::kNumber, "a value"), "value");
    pair.name = Take(Kind::kString, "the name of the value").text;
    values.push_back(std::move(pair));
  }
  lexer_.Next();
  return values;
}

void cDbcParser::ReadValueNames(uint32_t line) {
  if (lexer_.Peek().kind != Kind::kNumber) {  // values of an environment variable
    SkipStatement(line);
    return;
  }
  const tDbcToken id = lexer_.Next();
  tSignal *signal = SignalOf(id, Take(Kind::kIdentifier, "the signal name"));
  std::vector<tValueName> values = ReadValuePairs(line);
  if (signal != nullptr) signal->valueNames = std::move(values);
}

void cDbcParser::ReadValueTable(uint32_t line) {
  tValueTable table;
  table.name = Take(Kind::kIdentifier, "the value table name").text;
  table.values = ReadValuePairs(line);
  cluster_->valueTables.push_back(std::move(table));
}

tAttributeDefinition *cDbcParser::DefinitionOf(const std::string &name) {
  for (tAttributeDefinition &definition : cluster_->attributeDefinitions) {
    if (definition.name == name) return &definition;
  }
  return nullptr;
}

void cDbcParser::ReadAttributeDefinition(uint32_t line) {
  tAttributeDefinition definition;
  if (lexer_.Peek().kind == Kind::kIdentifier) definition.objectKind = lexer_.Next().text;
  definition.name = Take(Kind::kString, "the attribute name", line).text;
  definition.type = Take(Kind::kIdentifier, "the attribute type", line).text;
  const std::string &type = definition.type;
  if (type == "INT" || type == "HEX" || type == "FLOAT") {
    definition.minimum = Take(Kind::kNumber, "the attribute's minimum", line).text;
    definition.maximum = Take(Kind::kNumber, "the attribute's maximum", line).text;
  } else if (type == "ENUM") {
    while (lexer_.Peek().kind == Kind::kString) {
      definition.enumTexts.push_back(lexer_.Next().text);
      if (!PeekPunctuation(',')) break;
      lexer_.Next();
    }
  } else if (type != "STRING") {
    Fail(line, "unknown attribute type '" + type + "'");
  }
  EndStatement("after the attribute definition");
  // A name defined again is defined as it was last.
  if (tAttributeDefinition *known = DefinitionOf(definition.name)) {
    *known = std::move(definition);
  } else {
    cluster_->attributeDefinitions.push_back(std::move(definition));
  }
}

void cDbcParser::ReadAttributeDefault(uint32_t line) {
  const std::string name = Take(Kind::kString, "the attribute name").text;
  const tDbcToken value = lexer_.Next();
  if (value.kind == Kind::kEnd) Fail(line, "the text ends before the attribute's default");
  if (value.kind != Kind::kNumber && value.kind != Kind::kString) {
    Fail(value.line, "expected the attribute's default, found " + DescribeToken(value));
  }
  // A default of no definition describes nothing.
  if (tAttributeDefinition *definition = DefinitionOf(name)) {
    definition->defaultValue = tAttributeValue{value.text, value.kind == Kind::kString};
  }
  if (name == kAttrCycleTime) defaultCycleTime_ = ToDouble(value, "cycle time");
  if (name == kAttrStartValue) defaultStartValue_ = ToDouble(value, "start value");
  EndStatement("after the attribute's default");
}

void cDbcParser::ReadAttribute(uint32_t line) {
  const std::string name = Take(Kind::kString, "the attribute name").text;
  tFrame *frame = nullptr;
  tSignal *signal = nullptr;
  tEcu *ecu = nullptr;
  bool onCluster = true;
  if (lexer_.Peek().kind == Kind::kIdentifier) {
    onCluster = false;
    const std::string kind = lexer_.Next().text;
    if (kind == "BO_") {
      frame = FrameOf(Take(Kind::kNumber, "the frame identifier"));
    } else if (kind == "SG_") {
      const tDbcToken id = Take(Kind::kNumber, "the frame identifier");
      signal = SignalOf(id, Take(Kind::kIdentifier, "the signal name"));
    } else if (kind == "BU_") {
      ecu = EcuOf(Take(Kind::kIdentifier, "the node name"));
    } else if (kind == "EV_") {
      Take(Kind::kIdentifier, "the variable name");
    } else {
      Fail(line, "attribute of an unknown kind of object '" + kind + "'");
    }
  }
  const tDbcToken value = lexer_.Next();
  if (value.kind != Kind::kNumber && value.kind != Kind::kString) {
    Fail(value.kind == Kind::kEnd ? line : value.line,
         "expected the attribute's value, found " + DescribeToken(value));
  }
  tAttributeValues *values = onCluster ? &cluster_->attributes
                             : frame != nullptr ? &frame->attributes
                             : signal != nullptr ? &signal->attributes
                             : ecu != nullptr ? &ecu->attributes
                                              : nullptr;
  if (values != nullptr) (*values)[name] = tAttributeValue{value.text, value.kind == Kind::kString};
  if (frame != nullptr && name == kAttrCycleTime) {
    frame->cycleTimeMs = ToDouble(value, "cycle time");
    cycleTimeSet_.insert(frame);
  } else if (frame != nullptr && name == kAttrFrameFormat) {
    const uint32_t format = ToU32(value, "frame format");
    if (format == kFormatStandardCanFd || format == kFormatExtendedCanFd) {
      frame->format = FrameFormat::kCanFd;
    }
  } else if (frame != nullptr && name == kAttrPduMapping) {
    tPduMapping mapping;
    if (value.kind != Kind::kString || !ParsePduMapping(value.text, &mapping)) {
      Fail(value.line, "bad PDU mapping '" + value.text + "'");
    }
    frame->pdus = std::move(mapping);
  } else if (ecu != nullptr && name == kAttrStationAddress) {
    ecu->j1939Address = ToU32(value, "station address");
  } else if (signal != nullptr && name == kAttrStartValue) {
    signal->defaultRaw = ToDouble(value, "start value");
    startValueSet_.insert(signal);
  } else if (onCluster && name == kAttrBaudRate) {
    cluster_->baudRate = ToBaudRate(value);
  } else if (onCluster && name == kAttrFdBaudRate) {
    cluster_->fdBaudRate = ToBaudRate(value);
  } else if (onCluster && name == kAttrClusterName && value.kind == Kind::kString) {
    cluster_->name = value.text;
  }
  EndStatement("after the attribute");
}

void cDbcParser::ReadSignalType(uint32_t line) {
  const tDbcToken id = Take(Kind::kNumber, "the frame identifier");
  tSignal *signal = SignalOf(id, Take(Kind::kIdentifier, "the signal name"));
  Take(Kind::kPunctuation, "':' after the signal name", 0, ':');
  const tDbcToken kind = Take(Kind::kNumber, "the value type");
  const uint32_t type = ToU32(kind, "value type");
  if (type > 2) Fail(kind.line, "bad value type '" + kind.text + "'");
  if (signal != nullptr && type != 0) {
    if (signal->numBits != (type == 1 ? 32u : 64u)) {
      Fail(line, "signal '" + signal->name + "' has the wrong size for its float type");
    }
    signal->type = SignalType::kFloat;
  }
  EndStatement("after the value type");
}

// A statement that the database has no use for ends at its ';', or where a line starts at its
// first column again.
void cDbcParser::SkipStatement(uint32_t line) {
  uint32_t last = line;
  for (;;) {
    const tDbcToken &next = lexer_.Peek();
    if (next.kind == Kind::kEnd) return;
    if (next.line != last && next.column == 0) return;
    const tDbcToken token = lexer_.Next();
    if (token.kind == Kind::kPunctuation && token.text[0] == ';') return;
    last = token.line;
  }
}

void cDbcParser::Finish() {
  for (tFrame &frame : cluster_->frames) {
    if (cycleTimeSet_.count(&frame) == 0 && defaultCycleTime_) frame.cycleTimeMs = *defaultCycleTime_;
    bool multiplexed = false;
    for (tSignal &signal : frame.signals) {
      if (startValueSet_.count(&signal) == 0 && defaultStartValue_) {
        signal.defaultRaw = *defaultStartValue_;
      }
      multiplexed = multiplexed || signal.mux == MuxRole::kMultiplexed;
    }
    const tSignal *multiplexer = FindMultiplexer(frame);
    if (multiplexed && multiplexer == nullptr) {
      Fail(frameLines_[&frame], "frame '" + frame.name + "' has multiplexed signals and no multiplexer");
    }
    for (const tSignal &signal : frame.signals) {
      if (signal.mux == MuxRole::kMultiplexed && multiplexer->numBits < 32 &&
          signal.muxValue >> multiplexer->numBits != 0) {
        Fail(signalLines_[&signal], "signal '" + signal.name + "' is selected by " +
                                        std::to_string(signal.muxValue) + ", which multiplexer '" +
                                        multiplexer->name + "' of " +
                                        std::to_string(multiplexer->numBits) + " bits cannot take");
      }
    }
    AddMissingSubframes(&frame);
  }
}

}  // namespace

bool ReadDbc(std::string_view text, tDatabase *database, tDbcError *error,
             std::vector<tDbcError> *warnings) {
  try {
    constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
    if (text.substr(0, kByteOrderMark.size()) == kByteOrderMark) text.remove_prefix(kByteOrderMark.size());
    cDbcParser parser(text, database, warnings);
    parser.Run();
    return true;
  } catch (const tDbcSyntaxError &failure) {
    error->line = failure.line;
    error->message = failure.message;
    return false;
  }
}

}  // namespace nKvorSim

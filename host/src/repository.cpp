// MOF reader and class repository.
#include "cimhost/repository.h"

#include <algorithm>
#include <cctype>
#include <dirent.h>
#include <fstream>
#include <set>
#include <sstream>
#include <sys/stat.h>

namespace cimhost {

namespace {

std::string lower(std::string s) {
    for (auto& c : s) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return s;
}

enum class Tok { End, Ident, String, Number, Char, Punct };

struct Token {
    Tok kind = Tok::End;
    std::string text;
    int line = 0;
};

// Splits MOF text into tokens; comments and white space are dropped and
// adjacent string literals are joined.
class Lexer {
public:
    Lexer(const std::string& text) : t_(text) {}

    bool run(std::vector<Token>& out, std::string& err) {
        while (true) {
            skipBlank();
            if (pos_ >= t_.size()) break;
            const char c = t_[pos_];
            Token tok;
            tok.line = line_;
            if (std::isalpha(static_cast<unsigned char>(c)) || c == '_') {
                size_t s = pos_;
                while (pos_ < t_.size() &&
                       (std::isalnum(static_cast<unsigned char>(t_[pos_])) || t_[pos_] == '_'))
                    ++pos_;
                tok.kind = Tok::Ident;
                tok.text = t_.substr(s, pos_ - s);
            } else if (std::isdigit(static_cast<unsigned char>(c)) ||
                       ((c == '-' || c == '+' || c == '.') && pos_ + 1 < t_.size() &&
                        std::isdigit(static_cast<unsigned char>(t_[pos_ + 1])))) {
                size_t s = pos_++;
                while (pos_ < t_.size() && (std::isalnum(static_cast<unsigned char>(t_[pos_])) ||
                                            t_[pos_] == '.' || t_[pos_] == '+' || t_[pos_] == '-'))
                    ++pos_;
                tok.kind = Tok::Number;
                tok.text = t_.substr(s, pos_ - s);
            } else if (c == '"') {
                tok.kind = Tok::String;
                if (!readString(tok.text, err)) return false;
                if (!out.empty() && out.back().kind == Tok::String) {
                    out.back().text += tok.text;
                    continue;
                }
            } else if (c == '\'') {
                ++pos_;
                while (pos_ < t_.size() && t_[pos_] != '\'') {
                    if (t_[pos_] == '\\') ++pos_;
                    if (pos_ < t_.size()) tok.text += t_[pos_++];
                }
                if (pos_ >= t_.size()) {
                    err = "line " + std::to_string(tok.line) + ": unterminated character literal";
                    return false;
                }
                ++pos_;
                tok.kind = Tok::Char;
            } else {
                tok.kind = Tok::Punct;
                tok.text = std::string(1, c);
                ++pos_;
            }
            out.push_back(std::move(tok));
        }
        Token end;
        end.line = line_;
        out.push_back(end);
        return true;
    }

private:
    void skipBlank() {
        while (pos_ < t_.size()) {
            const char c = t_[pos_];
            if (c == '\n') {
                ++line_;
                ++pos_;
            } else if (std::isspace(static_cast<unsigned char>(c))) {
                ++pos_;
            } else if (c == '/' && pos_ + 1 < t_.size() && t_[pos_ + 1] == '/') {
                while (pos_ < t_.size() && t_[pos_] != '\n') ++pos_;
            } else if (c == '/' && pos_ + 1 < t_.size() && t_[pos_ + 1] == '*') {
                pos_ += 2;
                while (pos_ + 1 < t_.size() && !(t_[pos_] == '*' && t_[pos_ + 1] == '/')) {
                    if (t_[pos_] == '\n') ++line_;
                    ++pos_;
                }
                pos_ = std::min(t_.size(), pos_ + 2);
            } else {
                break;
            }
        }
    }

    bool readString(std::string& out, std::string& err) {
        const int startLine = line_;
        ++pos_;
        while (pos_ < t_.size() && t_[pos_] != '"') {
            char c = t_[pos_++];
            if (c == '\n') ++line_;
            if (c == '\\' && pos_ < t_.size()) {
                const char e = t_[pos_++];
                switch (e) {
                    case 'n': c = '\n'; break;
                    case 't': c = '\t'; break;
                    case 'r': c = '\r'; break;
                    case 'b': c = '\b'; break;
                    case 'f': c = '\f'; break;
                    default: c = e; break;
                }
            }
            out += c;
        }
        if (pos_ >= t_.size()) {
            err = "line " + std::to_string(startLine) + ": unterminated string";
            return false;
        }
        ++pos_;
        return true;
    }

    const std::string& t_;
    size_t pos_ = 0;
    int line_ = 1;
};

// Qualifiers the host cares about; all others are read and dropped.
struct Quals {
    bool key = false, association = false, indication = false, abstract = false;
    bool in = false, out = false, inSeen = false, embedded = false;
};

class Parser {
public:
    Parser(std::vector<Token> toks, std::string file, std::string dir, ClassRepository& repo, int depth)
        : toks_(std::move(toks)), file_(std::move(file)), dir_(std::move(dir)), repo_(repo), depth_(depth) {}

    bool run(std::string& err, std::string& includeErr) {
        try {
            while (peek().kind != Tok::End) topLevel(includeErr);
            return true;
        } catch (const std::string& e) {
            err = includeErr.empty() ? file_ + ":" + e : includeErr;
            return false;
        }
    }

private:
    const Token& peek(size_t ahead = 0) const {
        const size_t k = std::min(pos_ + ahead, toks_.size() - 1);
        return toks_[k];
    }
    const Token& next() {
        const Token& t = peek();
        if (pos_ < toks_.size() - 1) ++pos_;
        return t;
    }
    [[noreturn]] void fail(const std::string& what) const {
        throw std::to_string(peek().line) + ": " + what;
    }
    bool isPunct(const char* p) const { return peek().kind == Tok::Punct && peek().text == p; }
    bool isWord(const char* w) const { return peek().kind == Tok::Ident && lower(peek().text) == w; }
    void expectPunct(const char* p) {
        if (!isPunct(p)) fail(std::string("expected '") + p + "'" + near());
        next();
    }
    std::string ident(const char* what) {
        if (peek().kind != Tok::Ident) fail(std::string("expected ") + what + near());
        return next().text;
    }
    std::string near() const {
        return peek().kind == Tok::End ? " at end of file" : " near '" + peek().text + "'";
    }

    // Skips one value: a literal, an identifier, or a balanced () {} [] group.
    void skipValue() {
        int depth = 0;
        do {
            if (peek().kind == Tok::End) fail("unexpected end of file");
            const Token& t = next();
            if (t.kind == Tok::Punct) {
                if (t.text == "(" || t.text == "{" || t.text == "[") ++depth;
                if (t.text == ")" || t.text == "}" || t.text == "]") --depth;
            }
        } while (depth > 0);
    }

    void skipToSemicolon() {
        while (!isPunct(";")) {
            if (peek().kind == Tok::End) fail("expected ';'");
            skipValue();
        }
        next();
    }

    void topLevel(std::string& includeErr) {
        if (isPunct("#")) {
            next();
            if (!isWord("pragma")) fail("expected pragma" + near());
            next();
            const std::string name = lower(ident("pragma name"));
            expectPunct("(");
            std::string arg;
            if (peek().kind == Tok::String) arg = next().text;
            while (!isPunct(")")) {
                if (peek().kind == Tok::End) fail("unterminated pragma");
                next();
            }
            next();
            if (name == "namespace") nameSpace_ = arg;
            if (name == "include") include(arg, includeErr);
            return;
        }
        Quals q;
        if (isPunct("[")) q = qualifiers();
        if (isWord("class")) {
            next();
            classDecl(q);
        } else if (isWord("instance")) {
            next();
            if (!isWord("of")) fail("expected 'of'" + near());
            skipToSemicolon();
        } else if (isWord("qualifier")) {
            skipToSemicolon();
        } else if (isPunct(";")) {
            next();
        } else {
            fail("expected class, instance or qualifier declaration" + near());
        }
    }

    void include(const std::string& name, std::string& includeErr) {
        if (depth_ > 16) fail("includes nested too deep");
        std::string path = name;
        if (!path.empty() && path[0] != '/' && !dir_.empty()) path = dir_ + "/" + name;
        std::string err;
        if (!repo_.loadPath(path, err, depth_)) {
            includeErr = err;
            fail("include failed");
        }
    }

    Quals qualifiers() {
        Quals q;
        expectPunct("[");
        while (true) {
            const std::string name = lower(ident("qualifier name"));
            bool value = true;
            if (isPunct("(")) {
                next();
                if (peek().kind == Tok::Ident && lower(peek().text) == "false") value = false;
                while (!isPunct(")")) {
                    if (peek().kind == Tok::End) fail("unterminated qualifier value");
                    skipValue();
                }
                next();
            } else if (isPunct("{")) {
                skipValue();
            }
            if (isPunct(":")) {   // flavors
                next();
                while (peek().kind == Tok::Ident) {
                    next();
                    if (isPunct("(")) skipValue();
                }
            }
            if (name == "key") q.key = value;
            else if (name == "association") q.association = value;
            else if (name == "indication") q.indication = value;
            else if (name == "abstract") q.abstract = value;
            else if (name == "in") { q.in = value; q.inSeen = true; }
            else if (name == "out") q.out = value;
            else if (name == "embeddedinstance" || name == "embeddedobject") q.embedded = true;
            if (isPunct(",")) {
                next();
                continue;
            }
            expectPunct("]");
            return q;
        }
    }

    // A data type keyword, or `ClassName REF`. Returns false for a REF.
    void dataType(Type& type, std::string& refClass) {
        const std::string t = ident("data type");
        if (isWord("ref")) {
            next();
            type = Type::Reference;
            refClass = t;
            return;
        }
        if (lower(t) == "object") {
            type = Type::Instance;
            return;
        }
        if (!typeFromName(t, type)) fail("unknown data type '" + t + "'");
    }

    bool arraySuffix() {
        if (!isPunct("[")) return false;
        next();
        while (!isPunct("]")) {
            if (peek().kind == Tok::End) fail("unterminated array size");
            next();
        }
        next();
        return true;
    }

    void classDecl(const Quals& cq) {
        ClassDecl c;
        c.name = ident("class name");
        c.association = cq.association;
        c.indication = cq.indication;
        c.abstract = cq.abstract;
        c.nameSpace = nameSpace_;
        if (isPunct(":")) {
            next();
            c.superClass = ident("superclass name");
        }
        expectPunct("{");
        while (!isPunct("}")) {
            if (peek().kind == Tok::End) fail("unterminated class " + c.name);
            feature(c);
        }
        next();
        expectPunct(";");
        repo_.add(std::move(c));
    }

    void feature(ClassDecl& c) {
        Quals q;
        if (isPunct("[")) q = qualifiers();
        Type type;
        std::string refClass;
        dataType(type, refClass);
        const std::string name = ident("property or method name");
        if (isPunct("(")) {
            next();
            MethodDecl m;
            m.name = name;
            m.returnType = type;
            while (!isPunct(")")) {
                ParamDecl p;
                Quals pq;
                if (isPunct("[")) pq = qualifiers();
                dataType(p.type, p.refClass);
                p.name = ident("parameter name");
                p.array = arraySuffix();
                p.in = pq.inSeen ? pq.in : true;
                p.out = pq.out;
                p.embedded = pq.embedded;
                if (isPunct("=")) {
                    next();
                    skipValue();
                }
                m.params.push_back(std::move(p));
                if (isPunct(",")) next();
                else if (!isPunct(")")) fail("expected ',' or ')' in method " + name + near());
            }
            next();
            expectPunct(";");
            c.methods.push_back(std::move(m));
            return;
        }
        PropertyDecl p;
        p.name = name;
        p.type = type;
        p.refClass = refClass;
        p.key = q.key;
        p.embedded = q.embedded;
        p.array = arraySuffix();
        if (isPunct("=")) {
            next();
            skipValue();
        }
        expectPunct(";");
        c.properties.push_back(std::move(p));
    }

    std::vector<Token> toks_;
    size_t pos_ = 0;
    std::string file_, dir_;
    ClassRepository& repo_;
    int depth_;
    std::string nameSpace_;
};

bool endsWithMof(const std::string& n) {
    return n.size() > 4 && lower(n.substr(n.size() - 4)) == ".mof";
}

// The first declaration called `name` in class cls or, failing that, in its
// nearest superclass; at most 64 levels, so that a loop in the MOF ends.
template <class Decl>
const Decl* findInChain(const ClassRepository& repo, std::string cur, const std::string& name,
                        std::vector<Decl> ClassDecl::*list) {
    for (int guard = 0; guard < 64 && !cur.empty(); ++guard) {
        const ClassDecl* c = repo.find(cur);
        if (!c) return nullptr;
        for (const auto& d : c->*list)
            if (namesEqual(d.name, name)) return &d;
        cur = c->superClass;
    }
    return nullptr;
}

}  // namespace

const ParamDecl* MethodDecl::param(const std::string& n) const {
    for (const auto& p : params)
        if (namesEqual(p.name, n)) return &p;
    return nullptr;
}

bool ClassRepository::loadPath(const std::string& path, std::string& error, int depth) {
    struct stat st {};
    if (::stat(path.c_str(), &st) != 0) {
        error = path + ": no such file or directory";
        return false;
    }
    if (S_ISDIR(st.st_mode)) {
        std::vector<std::string> names;
        if (DIR* d = ::opendir(path.c_str())) {
            while (dirent* e = ::readdir(d))
                if (endsWithMof(e->d_name)) names.emplace_back(e->d_name);
            ::closedir(d);
        } else {
            error = path + ": cannot read directory";
            return false;
        }
        std::sort(names.begin(), names.end());
        for (const auto& n : names)
            if (!loadPath(path + "/" + n, error, depth)) return false;
        return true;
    }
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        error = path + ": cannot open";
        return false;
    }
    std::ostringstream ss;
    ss << in.rdbuf();
    return parse(ss.str(), path, error, depth);
}

bool ClassRepository::loadText(const std::string& text, const std::string& fileName, std::string& error) {
    return parse(text, fileName, error, 0);
}

bool ClassRepository::parse(const std::string& text, const std::string& fileName, std::string& error,
                            int depth) {
    std::vector<Token> toks;
    std::string lexErr;
    if (!Lexer(text).run(toks, lexErr)) {
        error = fileName + ":" + lexErr.substr(5);
        return false;
    }
    const auto slash = fileName.rfind('/');
    const std::string dir = slash == std::string::npos ? std::string() : fileName.substr(0, slash);
    Parser p(std::move(toks), fileName, dir, *this, depth + 1);
    std::string includeErr;
    return p.run(error, includeErr);
}

void ClassRepository::add(ClassDecl decl) {
    const std::string k = lower(decl.name);
    classes_[k] = std::move(decl);
    // A new class may be the superclass that gives another its keys.
    keyNameCache_.clear();
}

std::vector<std::string> ClassRepository::classNames() const {
    std::vector<std::string> out;
    for (const auto& kv : classes_) out.push_back(kv.second.name);
    return out;
}

const ClassDecl* ClassRepository::find(const std::string& name) const {
    auto it = classes_.find(lower(name));
    return it == classes_.end() ? nullptr : &it->second;
}

bool ClassRepository::isA(const std::string& cls, const std::string& ancestor) const {
    std::string cur = cls;
    for (int guard = 0; guard < 64 && !cur.empty(); ++guard) {
        if (namesEqual(cur, ancestor)) return true;
        const ClassDecl* c = find(cur);
        if (!c) return false;
        cur = c->superClass;
    }
    return false;
}

bool ClassRepository::chainComplete(const std::string& cls) const {
    std::string cur = cls;
    for (int guard = 0; guard < 64; ++guard) {
        const ClassDecl* c = find(cur);
        if (!c) return false;
        if (c->superClass.empty()) return true;
        cur = c->superClass;
    }
    return false;   // a cycle
}

std::vector<PropertyDecl> ClassRepository::allProperties(const std::string& cls) const {
    std::vector<const ClassDecl*> chain;
    std::string cur = cls;
    for (int guard = 0; guard < 64 && !cur.empty(); ++guard) {
        const ClassDecl* c = find(cur);
        if (!c) break;
        chain.push_back(c);
        cur = c->superClass;
    }
    std::vector<PropertyDecl> out;
    for (auto it = chain.rbegin(); it != chain.rend(); ++it) {
        for (const auto& p : (*it)->properties) {
            auto same = std::find_if(out.begin(), out.end(),
                                     [&](const PropertyDecl& o) { return namesEqual(o.name, p.name); });
            if (same == out.end()) {
                out.push_back(p);
            } else {
                const bool wasKey = same->key;
                *same = p;
                same->key = same->key || wasKey;   // Key is inherited by overrides
            }
        }
    }
    return out;
}

const PropertyDecl* ClassRepository::findProperty(const std::string& cls, const std::string& prop) const {
    return findInChain(*this, cls, prop, &ClassDecl::properties);
}

std::vector<std::string> ClassRepository::keyNames(const std::string& cls) const {
    std::vector<std::string> out;
    for (const auto& p : allProperties(cls))
        if (p.key) out.push_back(p.name);
    return out;
}

std::shared_ptr<const std::vector<std::string>> ClassRepository::sharedKeyNames(const std::string& cls) const {
    std::lock_guard<std::mutex> g(keyNameCache_.m);
    auto& slot = keyNameCache_.byClass[cls];
    if (!slot) slot = std::make_shared<const std::vector<std::string>>(keyNames(cls));
    return slot;
}

const MethodDecl* ClassRepository::findMethod(const std::string& cls, const std::string& method) const {
    return findInChain(*this, cls, method, &ClassDecl::methods);
}

}  // namespace cimhost

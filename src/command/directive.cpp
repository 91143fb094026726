#include "ZT/directive.h"

#include <new>

#include "ZT/error.h"
#include "command/directive_index.h"
#include "command/fold_case.h"
#include "core/number_text.h"
#include "core/write_text.h"

namespace {
void write_indented(std::ostream& out, const char* name)
{
    zt_core::write_text(out, "    ");
    zt_core::write_text(out, name ? name : "");
    zt_core::write_text(out, "\n");
}
} // namespace

ZtDirective::ZtDirective(const char* command_word)
    : KvoNamedObject(command_word)
{}

ZtDirective::~ZtDirective() = default;

int ZtDirective::Compare(void* key)
{
    return zt_command::compare_folded(name, static_cast<const char*>(key));
}

void ZtDirective::Act(KvoStatement*) {}

void ZtDirective::Info(std::ostream& out, int)
{
    write_indented(out, name);
}

ZtDispatcher::ZtDispatcher()
    : index(new (std::nothrow) zt_command::DirectiveIndex)
{}

ZtDispatcher::~ZtDispatcher()
{
    delete index;
    directives.DeleteContents();
}

void ZtDispatcher::Add(ZtDirective* directive)
{
    if (!directive)
        return;
    directives.Insert(directive);
    if (index)
        index->Forget();
}

void ZtDispatcher::Remove(ZtDirective* directive)
{
    if (!directive)
        return;
    directives.Remove(directive);
    if (index)
        index->Forget();
}

void ZtDispatcher::EachAdd(ZtDirective* directive)
{
    if (directive)
        each.Insert(directive, each.size);
}

void ZtDispatcher::EachRemove(ZtDirective* directive)
{
    each.Remove(each.Find(directive));
}

// Directives may register and withdraw others while they act, so the array is
// asked anew for each position.
void ZtDispatcher::Delegate(KvoStatement* statement)
{
    if (!statement)
        return;
    for (int i = 0; i < each.size; ++i)
        static_cast<ZtDirective*>(each[i])->Act(statement);
    const char* word = statement->ArgText(0);
    if (!word)
        return;
    if (ZtDirective* named = find(word))
        return named->Act(statement);
    if (auto* error = new (std::nothrow) ZtErr("Warning: ", 0, 3)) {
        error->stream << "Unknown command: ";
        statement->Write(error->stream);
        error->stream << "\n";
        error->Post();
    }
}

ZtDirective* ZtDispatcher::find(const char* word) const
{
    KvoObject* found = index ? index->Find(directives, word) : nullptr;
    return static_cast<ZtDirective*>(found ? found : directives.Search(word));
}

// Walks the nodes, not the list's cursor, which a directive may move.
void ZtDispatcher::Info(std::ostream& out, int number)
{
    for (KvoSkipList::SLNode* node = directives.header->forward[0]; node;
         node = node->forward[0])
        static_cast<ZtDirective*>(node->object)->Info(out, number);
}

ZtDirector::Directive::Directive(const char* command_word,
                                 ZtDirector& home_director, int own_selector)
    : ZtDirective(command_word), director(home_director), selector(own_selector)
{}

ZtDirector::Directive::~Directive() = default;

void ZtDirector::Directive::Act(KvoStatement* statement)
{
    return director.Act(statement, selector);
}

void ZtDirector::Directive::Info(std::ostream& out, int number)
{
    director.Info(out, name, selector, number);
}

ZtDirector::ZtDirector(ZtDispatcher& home_dispatcher)
    : dispatcher(home_dispatcher)
{}

ZtDirector::~ZtDirector()
{
    each_directives.DeleteContents();
}

void ZtDirector::AddDirective(int selector, const char* name)
{
    dispatcher.Add(new (std::nothrow) Directive(name, *this, selector));
}

void ZtDirector::AddEach(int selector)
{
    auto* directive = new (std::nothrow) Directive("each", *this, selector);
    if (!directive)
        return;
    each_directives.Insert(directive, each_directives.size);
    dispatcher.EachAdd(directive);
}

void ZtDirector::Act(KvoStatement* statement, int selector)
{
    auto* error = new (std::nothrow) ZtErr("Warning: ", 0, 3);
    if (!error)
        return;
    error->stream << "Command: ";
    if (statement)
        statement->Write(error->stream);
    error->stream << "\n    Not handled by director, selector = "
                  << zt_core::int_to_text(selector) << "\n";
    error->Post();
}

void ZtDirector::Info(std::ostream& out, char* name, int, int)
{
    write_indented(out, name);
}

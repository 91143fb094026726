#ifndef ZT_DIRECTIVE_H
#define ZT_DIRECTIVE_H

/// \file
/// From statements to actions: directives, the dispatcher that finds the one
/// named by a statement's first word, and directors, which register several.
///
/// Surprising: a dispatcher owns its named directives and deletes them with
/// itself, but it never owns the "each" directives, which see every statement.

#include <KVO/KvoObjArr.h>
#include <KVO/KvoObject.h>
#include <KVO/KvoSkipList.h>
#include <KVO/KvoStatement.h>

#include <iosfwd>

namespace zt_command {
class DirectiveIndex;
}

/// What a command word does. Names match without regard to the case of ASCII
/// letters.
class ZT_API ZtDirective : public KvoNamedObject
{
public:
    /// Names the directive with a copy of `command_word`; null is the empty
    /// name.
    explicit ZtDirective(const char* command_word);

    ~ZtDirective() override;

    /// Compares the name with `key`, a NUL-terminated command word, ignoring
    /// case; a null key is the empty word.
    int Compare(void* key) override;

    /// Carries the statement out; the base does nothing.
    ///
    /// Owner: the caller of `Delegate`; the directive may change the statement.
    virtual void Act(KvoStatement* statement);

    /// Writes four spaces, the name and a newline; the number is for derived
    /// classes.
    virtual void Info(std::ostream& out, int number);
};

/// Hands each statement to the "each" directives and then to the directive
/// that its first word names.
class ZT_API ZtDispatcher : public KvoObject
{
public:
    /// Makes a dispatcher without directives.
    ZtDispatcher();

    ZtDispatcher(const ZtDispatcher&) = delete;
    ZtDispatcher& operator=(const ZtDispatcher&) = delete;

    /// Deletes the named directives; the "each" directives stay.
    ~ZtDispatcher() override;

    /// Registers `directive` under its name; of several whose names are equal
    /// but for case the one added first is found. Null is ignored.
    ///
    /// Owner: the dispatcher, until it is removed.
    void Add(ZtDirective* directive);

    /// Takes `directive` out; does nothing if it is not in.
    ///
    /// Owner: the caller from then on.
    void Remove(ZtDirective* directive);

    /// Registers `directive` for every statement, after those already there;
    /// one registered twice acts twice. Null is ignored.
    ///
    /// Owner: the caller, who keeps it alive until it is removed.
    void EachAdd(ZtDirective* directive);

    /// Takes out the first registration of `directive` for every statement;
    /// does nothing if there is none.
    ///
    /// Owner: the caller, as before.
    void EachRemove(ZtDirective* directive);

    /// Lets every "each" directive act on `statement` in the order of their
    /// registration, then the directive named by its first word.
    ///
    /// Each sees the statement as the one before left it. Directives may add
    /// and remove directives meanwhile. A null statement, and one without
    /// words after the "each" directives, ends it silently.
    ///
    /// Reports: a warning, "Unknown command: " and the statement, if no
    ///          directive has that name.
    void Delegate(KvoStatement* statement);

    /// Lets every named directive write its `Info`, in the case-blind order of
    /// the names.
    ///
    /// Requires: none of them adds or removes directives meanwhile.
    void Info(std::ostream& out, int number);

private:
    ZtDirective* find(const char* word) const;

    KvoSkipList directives;
    KvoObjArray each; ///< In the order of registration, not owned.
    zt_command::DirectiveIndex* index; ///< Speeds `find` up; may be null.
};

/// Registers several directives, each with a selector number, that all come
/// back to its one `Act`.
class ZT_API ZtDirector : public KvoObject
{
public:
    /// A directive that passes its statements to a director.
    class ZT_API Directive : public ZtDirective
    {
    public:
        /// Requires: `home_director` outlives the directive's use.
        Directive(const char* command_word, ZtDirector& home_director,
                  int own_selector);

        ~Directive() override;

        /// Lets the director act on `statement` with this selector.
        void Act(KvoStatement* statement) override;

        /// Lets the director write about this name and selector.
        void Info(std::ostream& out, int number) override;

    private:
        ZtDirector& director;
        int selector;
    };

    /// Makes a director without directives.
    ///
    /// Requires: `home_dispatcher` outlives every later call of `AddDirective`
    ///           and `AddEach`.
    explicit ZtDirector(ZtDispatcher& home_dispatcher);

    ZtDirector(const ZtDirector&) = delete;
    ZtDirector& operator=(const ZtDirector&) = delete;

    /// Deletes the directives that `AddEach` made; those of `AddDirective` are
    /// the dispatcher's and stay there.
    ~ZtDirector() override;

    /// Registers the command word `name` under `selector`.
    ///
    /// Requires: the director outlives the dispatcher's use of the directive.
    /// Owner:    the dispatcher owns the directive that is made.
    void AddDirective(int selector, const char* name);

    /// Has every statement come to `Act` with `selector`, before its named
    /// directive.
    ///
    /// Requires: the director outlives the dispatcher's next `Delegate`.
    /// Owner:    the director owns the directive that is made.
    void AddEach(int selector);

    /// Carries out `statement` for the directive registered as `selector`.
    ///
    /// Reports: the base a warning that names statement and selector, since
    ///          derived directors are to override it.
    virtual void Act(KvoStatement* statement, int selector);

    /// Writes four spaces, `name` and a newline; the rest is for derived
    /// classes.
    virtual void Info(std::ostream& out, char* name, int selector, int number);

protected:
    ZtDispatcher& dispatcher; ///< Where the directives are registered.

private:
    KvoObjArray each_directives; ///< What `AddEach` made, owned.
};

#endif

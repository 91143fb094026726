#ifndef KVO_KVOPREFS_H
#define KVO_KVOPREFS_H

/// \file
/// Where the installation is, which work environment and project a tool works
/// in, and where the project keeps each kind of data.
///
/// Surprising: the settings are read when the library is loaded, before
/// `main`, by one shell line that runs the installation's query program,
/// `get_quarn_variable`. Where there is none nothing is started and nothing is
/// said. Values that were looked up once are kept: a change of the environment
/// is not seen afterwards.

#include <KVO/KvoObject.h>
#include <KVO/KvoSkipList.h>

/// The installation's settings. Nothing here reports anything: what is not
/// known is the empty text.
///
/// An environment variable that is set but empty counts as set. In a process
/// that runs with more rights than its user, QUARN_LOCATION counts as not set
/// and no query program is run.
///
/// Context: one thread; never inside the beat or a signal.
class ZT_API KvoPrefs
{
public:
    /// Where a value was found.
    enum class Origin : int {
        NotAsked = 0,     ///< It has not been looked up yet.
        Environment = 1,  ///< In the environment of the process.
        QueryProgram = 2, ///< The installation's query program printed it.
        Default = 3,      ///< Nobody named one, so the built-in one holds.
        SetHere = 4,      ///< This process set it.
        Nowhere = 5       ///< Nobody knows it; it is the empty text.
    };

    /// The settings that are no variables of the table.
    enum class Setting : int {
        Location = 0,
        DefaultProject = 1,
        Project = 2,
        WorkEnv = 3
    };

    /// A variable of the installation: its name, which is its key, and its
    /// value, looked up when it is first asked for.
    class ZT_API TableEntry : public KvoNamedObject
    {
    public:
        /// Makes a variable without a value; keeps copies of both texts.
        TableEntry(const char* variable_name, const char* default_text);

        TableEntry(const TableEntry&) = delete;
        TableEntry& operator=(const TableEntry&) = delete;
        ~TableEntry() override;

        /// Replaces the value by a copy of `text`, which may be the present
        /// value itself; null is the empty text.
        void SetValue(const char* text);

        /// Gives the value. The first time it is looked up, unless it was set
        /// before: in the environment, else by asking the query program.
        ///
        /// Owner:     this object, until the value is set.
        /// Returns:   never null; the empty text for what nobody knows, then
        ///            and ever after.
        /// By design: the default is not used
        ///            (KvoPrefs.TheDefaultOfAVariableIsNeverUsed).
        const char* Value();

        /// Gives the default that the variable was made with.
        ///
        /// Owner:   this object.
        /// Returns: never null.
        const char* Default() const;

        /// Tells where the value was found; does not look it up.
        Origin ValueOrigin() const { return origin; }

    private:
        friend class KvoPrefs;

        void keep(const char* text, Origin found);

        char* fallback; ///< The default, the object's own copy.
        char* value;    ///< The object's own copy; null until looked up.
        Origin origin;
    };

    /// Reads the installation's settings, if nothing has read them yet. The
    /// library makes one at load; every further one does nothing.
    KvoPrefs();

    /// Sets the variable `name`; a new one gets `value` as its default too.
    /// Null is the empty text.
    static void SetVariable(const char* name, const char* value);

    /// Gives the value of the variable `name`, which is made with
    /// `default_text` if it is new.
    ///
    /// What the environment does not have is asked for with one run of the
    /// query program. A name with anything but letters, digits and underscores
    /// is never handed to it.
    ///
    /// Owner:   the table, until the variable is set.
    /// Returns: never null; see `TableEntry::Value`.
    static const char* Variable(const char* name, const char* default_text);

    /// Gives the table of variables, to look at: `TableEntry` by name.
    ///
    /// Owner: this class, for the whole process.
    static const KvoSkipList& Table();

    /// Tells where a setting was found.
    static Origin OriginOf(Setting setting);

    /// Sets the work environment to a copy of `dir`; null is ".".
    static void SetWorkEnv(const char* dir);

    /// Gives the directory of the work environment.
    ///
    /// Owner: this class, until it is set.
    static const char* WorkEnv();

    /// Sets the project to a copy of `name`; null is the default project.
    ///
    /// A name that begins with a slash is the project's directory itself.
    static void SetProject(const char* name);

    /// Gives the project.
    ///
    /// Owner: this class, until it is set.
    static const char* Project();

    /// The directories of the project's kinds of data. Each is that of
    /// `build_subdir` for the value of a variable, which is named behind it.
    ///
    /// Owner:   a temporary string: the caller copies what is to be kept.
    /// Returns: the project's directory and a slash if nobody knows the
    ///          variable.
    static const char* WireDir();    ///< QUARN_WIRE_DIR
    static const char* PixDir();     ///< QUARN_INPUT_PIX_DIR
    static const char* MiscDir();    ///< QUARN_MISC_DIR
    static const char* StageDir();   ///< QUARN_STAGE_DIR
    static const char* SLADir();     ///< QUARN_SLA_DIR
    static const char* SDLDir();     ///< QUARN_SDL_DIR
    static const char* AnimDir();    ///< QUARN_ANIM_DIR
    static const char* ShaderDir();  ///< QUARN_SHADER_DIR
    static const char* TextureDir(); ///< QUARN_TEXTURE_DIR
    static const char* OptionDir();  ///< QUARN_OPTION_DIR
    static const char* PlotDir();    ///< QUARN_PLOT_DIR

    /// Gives the project's directory: the project itself if it begins with a
    /// slash, else its name below user_data in the work environment.
    ///
    /// Owner: a temporary string.
    static const char* ProjectDir();

    /// Gives the directory of the installation's help.
    ///
    /// Owner: a temporary string.
    static const char* HelpDir();

    /// Gives `sub` itself if it begins with a slash, else its place below the
    /// project's directory; null is that directory.
    ///
    /// Owner: a temporary string.
    static const char* build_subdir(const char* sub);

    static char* location;        ///< QUARN_LOCATION, else "/usr/quarn".
    static char* default_project; ///< As the installation says, else "demo".
    static char* project;         ///< QUARN_PROJECT, else the default.
    static char* workenv;         ///< QUARN_WORKENV, else ".".
    static int coord_sys;         ///< 0 with y up, 1 otherwise.

private:
    static void load_once();
    static TableEntry* entry(const char* name, const char* default_text);
};

/// Makes the settings be read at load, also in a program that takes the
/// library from a static archive.
static const KvoPrefs kvo_prefs_at_load;

#endif

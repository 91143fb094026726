/// \file
/// The command word Gaps, a plug-in: which frames of the numbered files in a
/// directory are missing.

#include <ZT/directive.h>
#include <ZT/error.h>
#include <ZT/filepath.h>
#include <ZT/plug.h>

#include <climits>
#include <filesystem>
#include <iostream>
#include <map>
#include <set>
#include <string>

namespace {

/// The files of one sequence: what stands before and behind the number.
using Sequence = std::pair<std::string, std::string>;
using Sequences = std::map<Sequence, std::set<int>>;

/// Takes "shot.0042.rgb" apart into "shot.", 42 and ".rgb".
///
/// Returns: false if there is no number between points, or behind the last.
bool take_apart(const std::string& name, Sequence& sequence, int& number)
{
    // The number is that of the last piece of digits, which is looked for
    // from the end.
    for (std::size_t end = name.size(); end > 0;) {
        const std::size_t point = name.rfind('.', end - 1);
        if (point == std::string::npos)
            return false;
        const std::string piece = name.substr(point + 1, end - point - 1);
        if (!piece.empty() &&
            piece.find_first_not_of("0123456789") == std::string::npos) {
            sequence = {name.substr(0, point + 1), name.substr(end)};
            // Numbers too long for an int are its upper end.
            number = ZtFilePath(("x." + piece).c_str()).Number();
            return true;
        }
        end = point;
    }
    return false;
}

/// Writes the ranges between the numbers that are there.
void write_missing(std::ostream& out, const std::set<int>& there)
{
    int expected = *there.begin();
    const char* before = " missing ";
    for (const int number : there) {
        if (number > expected) {
            out << before << expected;
            if (number - 1 > expected)
                out << "-" << number - 1;
            before = " ";
        }
        // The highest int there is has none behind it.
        expected = number == INT_MAX ? number : number + 1;
    }
}

class Gaps : public ZtDirective
{
public:
    Gaps() : ZtDirective("Gaps") {}

    void Act(KvoStatement* statement) override
    {
        if (statement->Count() > 2) {
            ZtError("Gaps: expected: Gaps [DIRECTORY]\n");
            return;
        }
        const char* directory = statement->ArgText(1);
        write(directory ? directory : ".");
    }

    void Info(std::ostream& out, int number) override
    {
        out << "    Gaps [DIRECTORY]\n";
        if (number > 0)
            out << "        Tells which frames of the numbered files in the "
                   "directory are missing.\n";
    }

private:
    static void write(const char* directory)
    {
        Sequences sequences;
        std::error_code fault;
        std::filesystem::directory_iterator file(directory, fault);
        for (; !fault && file != std::filesystem::directory_iterator();
             file.increment(fault)) {
            Sequence sequence;
            int number = 0;
            if (take_apart(file->path().filename().string(), sequence, number))
                sequences[sequence].insert(number);
        }
        if (fault)
            ZtError("Gaps: %s: %s\n", directory, fault.message().c_str());
        for (const auto& [sequence, numbers] : sequences) {
            std::cout << sequence.first << "#" << sequence.second << " "
                      << *numbers.begin() << "-" << *numbers.rbegin();
            write_missing(std::cout, numbers);
            std::cout << "\n";
        }
    }
};

} // namespace

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->OfferPlug("Gaps", new Gaps);
}

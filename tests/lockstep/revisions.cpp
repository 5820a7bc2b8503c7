/* Runs two layers side by side over random operations, and counts by kind what they do differently. */
#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <map>
#include <string>
#include <vector>

#include "tests/lockstep/compare.h"
#include "tests/lockstep/draw.h"

namespace lockstep
{
namespace
{

constexpr const char* usage =
    R"(usage: revisions [--count N] [--seed S] [--operation NAME] [--undisturbed] [--no-padding] [--all]
                 [--names FIRST SECOND]

Runs N random operations in both layers. In every other run a neighbour changes one field inside a platform call.
  --count N            operations to run (1000000)
  --seed S             another seed, other operations (1)
  --operation NAME     this operation alone
  --undisturbed        no neighbour
  --no-padding         padding of records behind pointers may differ
  --all                show every kind of difference in full, not the first one alone
)";

struct Options
{
    std::uint64_t count = 1000000;
    std::uint64_t seed = 1;
    std::string operation;
    bool disturbed = true;
    bool all = false;
    Comparison comparison;
};

struct Found
{
    std::uint64_t undisturbed = 0;
    std::uint64_t disturbed = 0;
    std::string example;
};

/* Everything that one run follows from. */
struct Trial
{
    const Operation* operation;
    Arguments arguments;
    Image before;
    Surroundings surroundings;
};

std::string field_named(const Operation& operation, const Disturbance& disturbance)
{
    return field_at(operation, disturbance.offset) + " becomes " + std::to_string(disturbance.value) + " inside call " +
           std::to_string(disturbance.call);
}

class Lockstep
{
public:
    explicit Lockstep(const Options& options) : m_options(options), m_state(started_state()), m_runs(operation_count) {}

    void run_all()
    {
        Random random(m_options.seed);
        const std::vector<unsigned> offered = common_operations();
        for (std::uint64_t i = 0; i < m_options.count; ++i)
        {
            Trial trial{ &operations[offered[random.below(offered.size())]], {}, {}, {} };
            draw(random, trial);
            run_one(trial, i);
            if (m_options.disturbed && !m_traces[0].calls.empty() && random.once_in(2))
            {
                const auto calls = static_cast<unsigned>(m_traces[0].calls.size());
                trial.surroundings.disturbance = draw_disturbance(random, *trial.operation, calls);
                run_one(trial, i);
            }
            m_state = m_traces[1].after;
        }
    }

    /** Whether nothing was found. */
    bool report() const
    {
        std::cout << m_options.count << " operations, " << m_disturbed << " of them again with a neighbour; " << m_calls
                  << " calls compared\n";
        for (unsigned i = 0; i < operation_count; ++i)
        {
            if (m_runs[i] == 0 && m_options.operation.empty())
                std::cout << operations[i].function.name << " was not run: it is not in both layers\n";
        }
        if (m_found.empty())
        {
            std::cout << "no difference\n";
            return true;
        }
        std::cout << "undisturbed  disturbed  difference\n";
        for (const auto& [kind, found] : m_found)
        {
            std::string counts = std::to_string(found.undisturbed);
            counts.insert(0, 11 - std::min<std::size_t>(11, counts.size()), ' ');
            std::string disturbed = std::to_string(found.disturbed);
            disturbed.insert(0, 11 - std::min<std::size_t>(11, disturbed.size()), ' ');
            std::cout << counts << disturbed << "  " << kind << '\n';
        }
        std::cout << "\nthe first:\n" << m_first;
        for (const auto& [kind, found] : m_found)
        {
            if (m_options.all)
                std::cout << '\n' << kind << ":\n" << found.example;
        }
        return false;
    }

    bool ran() const
    {
        return std::any_of(m_runs.begin(), m_runs.end(), [](std::uint64_t runs) { return runs != 0; });
    }

private:
    std::vector<unsigned> common_operations() const
    {
        std::vector<unsigned> common;
        for (unsigned i = 0; i < operation_count; ++i)
        {
            const bool wanted = m_options.operation.empty() || operations[i].function.name == m_options.operation;
            if (wanted && operations[i].entries[0] != nullptr && operations[i].entries[1] != nullptr)
                common.push_back(i);
        }
        if (common.empty())
        {
            std::cerr << "no operation to run\n";
            std::exit(2);
        }
        return common;
    }

    void draw(Random& random, Trial& trial)
    {
        if (random.once_in(4))
            m_state = started_state();
        if (!random.once_in(4))
            draw_state(random, m_state);
        trial.arguments = draw_arguments(random, *trial.operation, m_state);
        trial.before = m_state;
        trial.surroundings.seed = random.next();
        trial.surroundings.calm = random.once_in(2);
    }

    void run_one(const Trial& trial, std::uint64_t number)
    {
        for (unsigned layer = 0; layer < 2; ++layer)
            run(*trial.operation, layer, trial.arguments, trial.before, trial.surroundings, m_traces[layer]);
        ++m_runs[static_cast<std::size_t>(trial.operation - operations)];
        m_disturbed += trial.surroundings.disturbance.call != never;
        m_calls += m_traces[0].calls.size();
        note(trial, number, compare_calls(*trial.operation, m_traces[0], m_traces[1], m_options.comparison));
        note(trial, number, compare_stores(*trial.operation, m_traces[0], m_traces[1], m_options.comparison));
    }

    void note(const Trial& trial, std::uint64_t number, const std::optional<Difference>& difference)
    {
        if (!difference)
            return;
        const Function& function = trial.operation->function;
        Found& found = m_found[difference->kind + ": " + function.name + ": " + difference->where];
        const Disturbance& disturbance = trial.surroundings.disturbance;
        ++(disturbance.call == never ? found.undisturbed : found.disturbed);
        if (!found.example.empty())
            return;
        found.example = "operation " + std::to_string(number) + ": " +
                        shown_operation(*trial.operation, trial.arguments, trial.before) + "\n";
        if (disturbance.call != never)
            found.example += "  " + field_named(*trial.operation, disturbance) + "\n";
        found.example += difference->text;
        if (m_first.empty())
            m_first = found.example + "  all calls of " + m_options.comparison.names[0] + ":\n" +
                      shown_calls(m_traces[0], disturbance.call) + "  all calls of " + m_options.comparison.names[1] +
                      ":\n" + shown_calls(m_traces[1], disturbance.call);
    }

    const Options& m_options;
    Image m_state;
    Trace m_traces[2];
    std::vector<std::uint64_t> m_runs;
    std::map<std::string, Found> m_found;
    std::string m_first;
    std::uint64_t m_disturbed = 0;
    std::uint64_t m_calls = 0;
};

[[noreturn]] void refuse(const std::string& what)
{
    std::cerr << what << '\n' << usage;
    std::exit(2);
}

std::uint64_t number_of(const std::string& option, const char* text)
{
    char* end = nullptr;
    const unsigned long long value = std::strtoull(text, &end, 0);
    if (*text < '0' || *text > '9' || *end != '\0')
        refuse(option + " takes a number, not " + text);
    return value;
}

Options options_of(int count, char** words)
{
    Options options;
    for (int i = 1; i < count; ++i)
    {
        const std::string option = words[i];
        const int values = option == "--names"                                                    ? 2
                           : option == "--count" || option == "--seed" || option == "--operation" ? 1
                                                                                                  : 0;
        if (i + values >= count)
            refuse(option + " takes a value");
        if (option == "--count")
            options.count = number_of(option, words[i + 1]);
        else if (option == "--seed")
            options.seed = number_of(option, words[i + 1]);
        else if (option == "--operation")
            options.operation = operations[operation_number(words[i + 1])].function.name;
        else if (option == "--names")
            std::memcpy(options.comparison.names, words + i + 1, sizeof options.comparison.names);
        else if (option == "--undisturbed")
            options.disturbed = false;
        else if (option == "--no-padding")
            options.comparison.padding = false;
        else if (option == "--all")
            options.all = true;
        else
            refuse("no such option: " + option);
        i += values;
    }
    return options;
}

} // namespace
} // namespace lockstep

int main(int count, char** words)
{
    const lockstep::Options options = lockstep::options_of(count, words);
    const auto start = std::chrono::steady_clock::now();
    lockstep::Lockstep lockstep(options);
    lockstep.run_all();
    const bool same = lockstep.report();
    const std::chrono::duration<double> seconds = std::chrono::steady_clock::now() - start;
    std::cerr << seconds.count() << " s\n";
    if (!lockstep.ran())
    {
        std::cerr << "nothing was compared\n";
        return 2;
    }
    return same ? 0 : 1;
}

#include <CLI/CLI.hpp>

#include <memory>

#include "hosts/console/Command.h"
#include "hosts/console/Conversion.h"
#include "hosts/console/Outputs.h"

namespace console
{

void AddMdfExportCommand(CLI::App& mdf, int& status)
{
    auto files = std::make_shared<ConversionFiles>();
    CLI::App* command = mdf.add_subcommand("export", "Make a table of a motion data file, that import reads back.");
    command->add_option("run", files->from, "The motion data file.")->type_name("RUN.mdf")->required();
    command->add_option("-o,--output", files->to, "The table to write.")->type_name("DATA.csv")->required();
    command->footer("Example:\n"
                    "  panoramic mdf export run.mdf -o data.csv");
    command->callback(
        [files, &status]
        {
            CheckOutput(files->to, Content::table, {files->from});
            status = Convert(*files, SimulationDataPoints::VtCMotionDataCsv::Export);
        });
}

} // namespace console

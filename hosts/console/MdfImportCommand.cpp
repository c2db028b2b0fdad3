#include <CLI/CLI.hpp>

#include <iostream>
#include <memory>

#include "hosts/console/Command.h"
#include "hosts/console/Conversion.h"
#include "hosts/console/Outputs.h"

namespace console
{

void AddMdfImportCommand(CLI::App& mdf, int& status)
{
    auto files = std::make_shared<ConversionFiles>();
    CLI::App* command = mdf.add_subcommand("import", "Make a motion data file of a table.");
    command->add_option("table", files->from, "The table, comma separated.")->type_name("DATA.csv")->required();
    command->add_option("-o,--output", files->to, "The motion data file to write.")->type_name("RUN.mdf")->required();
    command->footer("The first row names the columns: time; for a pose NAME the columns NAME.x NAME.y NAME.z with\n"
                    "NAME.roll NAME.pitch NAME.yaw (degrees) or NAME.qw NAME.qx NAME.qy NAME.qz; any other column is\n"
                    "an instrument stream, its unit in square brackets.\n\n"
                    "Example:\n"
                    "  panoramic mdf import data.csv -o run.mdf");
    command->callback(
        [files, &status]
        {
            CheckOutput(files->to, Content::motionData, {files->from});
            status = Convert(*files, SimulationDataPoints::VtCMotionDataCsv::Import);
        });
}

} // namespace console

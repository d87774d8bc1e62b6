// Loading a CSV database: one array, one node per row, the header's names as
// the keys of every node's pairs.
#include "data/CsvReader.h"
#include "data/Database.h"
#include "host/HostReport.h"

bool Database::LoadCsv(const char* newPath)
{
    CsvReader reader;
    if (!reader.Open(newPath)) {
        HostReportError(1, "CSV Array File '%s' not found!", newPath != nullptr ? newPath : "null");
        reader.Close();
        return false;
    }

    DataArray* array = AddArray();
    int32_t rows = 0;
    // Each node takes exactly columnCount fields, whichever separator ended them.
    // With no column at all no field is ever read, so there are no rows either.
    char field[CsvReader::kDataFieldLimit + 1];
    while (reader.columnCount > 0 && !reader.AtEnd()) {
        DataNode* node = array->AddNode();
        ++rows;
        node->ReserveValues(reader.columnCount);
        for (int32_t i = 0; i < reader.columnCount; ++i) {
            const bool present = !reader.AtEnd() && reader.ReadField(field, CsvReader::kDataFieldLimit) ==
                                                        CsvReader::Field::Complete;
            node->AddValue(reader.columnNames[i], present ? field : nullptr);
        }
    }
    reader.Close();

    HostLogInfo("%d CSV Arrays loaded with total %d nodes.", 1, rows);
    return true;
}

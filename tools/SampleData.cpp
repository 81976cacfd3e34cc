#include "tools/FirstFiles.h"

#include <algorithm>
#include <cstdint>
#include <string_view>
#include <vector>

#include "app/model/RecordLayouts.h"
#include "db/Database.h"
#include "tools/RecordFields.h"

namespace {

// The records of a file, each a line of what its columns hold in their order.
constexpr std::string_view PickLists = R"(
Type|Stock
Type|Stock Fund
Type|Bond Fund
Type|Index Fund
Type|Mixed Fund
Type|Money Market Fund
Type|Bond
Type|Real Estate
Type|Savings Account
Type|Other
Agent|Self
Agent|Bank
Agent|Broker
Agent|Online Broker
Agent|Employer Plan
Agent|Insurance
)";

// One is German for "for later".
constexpr std::string_view Portfolios = R"(
Für später
My Retirement Fund
)";

// Portfolio, Name, Ticker, Type, Retire, Shares, Date, Price, PrevPrice, Value, Agent, Risk, QuoteError.
constexpr std::string_view Investments = R"(
Für später|Nordlicht Energie|NRDL|Stock|0|150|20250303|22.25|21.875|3337.5|Online Broker|High|0
Für später|Ölmühle Weber|OELW|Stock|0|40|20250303|110.75|112|4430|Broker|Med|0
Für später|Café Parisien|CAFP|Stock|0|260|20250303|8.15625|8.15625|2120.625|Self|High|0
Für später|Quince Software|QNCE|Stock|0|33|20250303|204.34375|187.5|6743.3438|Online Broker|High|0
Für später|Rowan Shipping|ROWN|Stock|0|500|20250303|5.5|6.25|2750|Online Broker|High|0
Für später|Spruce Foods|SPRF|Stock|0|90|20250224|47.8125|-1|4303.125|Broker|Low|0
Für später|Tamarack Telephone|TMRK|Stock|1|75|20250303|36.625|36.5|2746.875|Broker|Low|0
Für später|Upland Index World|UPIDX|Index Fund|0|212.5|20250303|98.41|97.2|20912.125|Online Broker|Med|0
Für später|Upland Growth|UPGRO|Stock Fund|1|64.125|20250303|71.9|74.33|4610.5874|Online Broker|High|0
Für später|Vine Income|VINEI|Mixed Fund|0|318|20250303|14.07|14.07|4474.26|Bank|Med|0
Für später|Willow Bonds|WLLWB|Bond Fund|0|1042.6|20250303|11.18|11.21|11656.268|Bank|Low|0
Für später|Yew Closed Fund|YEWC|Mixed Fund|0|25|20241114|33.4|33.9|835.00006|Broker|Med|1
Für später|Zelkova Mines|ZLKV|Stock|0|1000|20250203|1.21875|1.1875|1218.75|Self|High|1
Für später|Everyday savings||Savings Account|0|1|20250301|6431.17|-1|6431.17|Bank|Low|0
Für später|Gold coins||Other|1|12.5|20250228|268|261|3350|Self|Med|0
Für später|Garden allotment share|||0|1|20240612|350|-1|350||Med|0
My Retirement Fund|Alder Paper Mills|ALDP|Stock|1|120|20250303|12.375|12.125|1485|Broker|Med|0
My Retirement Fund|Birch & Sons|BRCH|Stock|1|45.5|20250303|88.5|90.25|4026.75|Broker|Med|0
My Retirement Fund|Cedar Rail|CDRR|Stock|1|300|20250303|7.03125|7.03125|2109.375|Online Broker|High|0
My Retirement Fund|Dogwood Biolabs|DGWD|Stock|1|80|20250228|31.96875|24.5|2557.5|Online Broker|High|0
My Retirement Fund|Elm Street Water Works|ELMW|Stock|1|210|20250303|41|40.75|8610|Broker|Low|0
My Retirement Fund|Fir Hill Index 500|FHIDX|Index Fund|1|154.321|20250303|143.87|142.1|22202.162|Employer Plan|Med|0
My Retirement Fund|Fir Hill Small Companies|FHSML|Stock Fund|1|96.044|20250303|52.5|53.75|5042.31|Employer Plan|High|0
My Retirement Fund|Grove Long Bonds|GRVLB|Bond Fund|1|1200|20250303|9.84|9.84|11808|Employer Plan|Low|0
My Retirement Fund|Grove Short Bonds|GRVSB|Bond Fund|1|800.75|20250303|10.02|10.01|8023.515|Employer Plan|Low|0
My Retirement Fund|Hazel Cash Reserve|HZLC|Money Market Fund|1|15250.4|20250303|1|1|15250.4|Bank|Low|0
My Retirement Fund|Ironwood Tools|IRNW|Stock|1|64|20250117|19.6875|-1|1260|Broker|Med|0
My Retirement Fund|Juniper Old Holdings|JNPO|Stock|1|500|20240809|0.46875|0.5|234.375|Broker|High|1
My Retirement Fund|Pension Insurance||Other|1|1|20241231|48200|-1|48200|Insurance|Low|0
My Retirement Fund|Kauri World Balanced|KWBAL|Mixed Fund|1|410.2|20250303|27.31|26.98|11202.5625|Employer Plan|Med|0
My Retirement Fund|Larch Real Estate|LRCHR|Real Estate|1|75|20250303|61.2|63.05|4590|Insurance|Med|0
My Retirement Fund|Municipal Bond 2031||Bond|1|20|20240902|1012.5|-1|20250|Bank|Low|0
)";

// Cuts off what stands before the separator, and that.
std::string_view TakeUpTo(char separator, std::string_view& text) {
    const std::string_view taken = text.substr(0, text.find(separator));
    text.remove_prefix(std::min(taken.size() + 1, text.size()));
    return taken;
}

bool AppendLines(DATABASE& file, std::string_view lines) {
    DATABASE_HEADER header{};
    file.GetHeaderInfo(&header);
    TakeUpTo('\n', lines); // the empty one before the first
    while (!lines.empty()) {
        std::string_view line = TakeUpTo('\n', lines);
        std::vector<std::uint8_t> data(static_cast<std::size_t>(header.recordLength));
        for (int i = 0; i < header.columnCount; ++i) {
            COLUMN_ENTRY column{};
            if (file.GetColumnInfo(i, &column) != 0 ||
                !StoreField(column, TakeUpTo('|', line), data.data()).empty())
                return false;
        }
        if (file.Append(data.data()) < 0)
            return false;
    }
    return true;
}

} // namespace

bool AppendPickLists(DATABASE& categories) {
    return AppendLines(categories, PickLists);
}

bool AppendSamplePortfolios(DATABASE& portfolios) {
    return AppendLines(portfolios, Portfolios);
}

bool AppendSampleInvestments(DATABASE& investments) {
    return AppendLines(investments, Investments);
}

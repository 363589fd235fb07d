# Most of the time that a file takes to compile goes into reading headers.
set(PLEXOR_COMMON_HEADERS <algorithm> <atomic> <chrono> <condition_variable> <cstring> <filesystem>
    <fstream> <functional> <iostream> <iterator> <map> <memory> <mutex> <optional> <random> <set>
    <shared_mutex> <span> <sstream> <stdexcept> <string> <string_view> <thread> <tuple>
    <unordered_map> <utility> <variant> <vector> <nlohmann/json.hpp>)
# For static libraries and objects of them; testbed_broker, which all need, compiles the headers.
function(plexor_common_headers target)
    target_precompile_headers(${target} REUSE_FROM testbed_broker)
endfunction()

// morvik_pkg: the bit-accurate model of the turbo decoder in SystemVerilog. docs/systemverilog.md explains it.
//
//     import morvik_pkg::*;
//     morvik_decoder model = new(4, ALGORITHM_SCALED);   // processing units, algorithm
//     if (model.decode(sys, par1, par2, 8, tag) == 0)     // K + 4 soft values each, eight iterations
//         compare(model.dout, model.dout_tag);
//     model.destroy();
package morvik_pkg;

    import "DPI-C" function chandle morvik_dpi_create(input int num_pu, input int algorithm, input int tag_width);
    import "DPI-C" function void morvik_dpi_destroy(input chandle decoder);
    import "DPI-C" function int morvik_dpi_is_open(input chandle decoder);
    import "DPI-C" function void morvik_dpi_put(input chandle decoder, input int sys, input int par1, input int par2);
    import "DPI-C" function int morvik_dpi_decode(input chandle decoder, input int iterations, input int unsigned tag);
    import "DPI-C" function int morvik_dpi_size(input chandle decoder);
    import "DPI-C" function int morvik_dpi_bit(input chandle decoder, input int position);
    import "DPI-C" function int unsigned morvik_dpi_tag(input chandle decoder);
    import "DPI-C" function string morvik_dpi_message(input chandle decoder);

    localparam int ALGORITHM_MAX_LOG = 0;
    localparam int ALGORITHM_SCALED = 1;  // max-log, extrinsic values times 0.75
    localparam int ALGORITHM_TABLE = 2;   // max-log with a correction table

    typedef int soft_values_t[];  // K + 4 values of a stream, -128 to 127; positive ones favour bit 1
    typedef bit decisions_t[];

    // How error and warning lines reach the log. A derived class can hand them to uvm_error and uvm_warning instead; an
    // object of it in morvik_log serves all decoders.
    class morvik_reporter;
        virtual function void report_error(string line);
            $error("morvik: %s", line);
        endfunction

        virtual function void report_warning(string line);
            $warning("morvik: %s", line);
        endfunction
    endclass

    morvik_reporter morvik_log;

    // A decoder. Call destroy when done with it: its memory is outside the simulator's.
    class morvik_decoder;
        // Results of the last call.
        int status;             // 0 decoded, 1 an argument was refused, 2 the block was refused, 99 out of memory
        string message;         // all lines that the model wrote, separated by line feeds
        decisions_t dout;       // K decisions; none if the block was refused
        int unsigned dout_tag;  // the tag, truncated to tag_width bits

        local chandle handle;
        local bit destroyed;

        // num_pu 2, 4 or 8; algorithm 0 to 2; tag_width 0 to 32. Other values are reported, and is_open tells.
        function new(int num_pu = 2, int algorithm = ALGORITHM_SCALED, int tag_width = 8);
            handle = morvik_dpi_create(num_pu, algorithm, tag_width);
            status = 1 - morvik_dpi_is_open(handle);
            if (handle == null)
                add_message("ERROR:binding:No memory for a decoder");
            collect_messages();
        endfunction

        // Whether decode can be called.
        function bit is_open();
            return morvik_dpi_is_open(handle) != 0;
        endfunction

        // Decodes a block and returns the status. The decisions are in dout, the tag is in dout_tag.
        function int decode(
            input soft_values_t sys,
            input soft_values_t par1,
            input soft_values_t par2,
            input int iterations = 8,
            input int unsigned tag = 0
        );
            int result;  // not status: Verilator 5.006 assumes that calls in between do not change a member
            result = 1;
            message = "";
            dout = new[0];
            if (destroyed)
                add_message("ERROR:binding:decode was called after destroy");
            else if (handle == null)
                add_message("ERROR:binding:decode was called without a decoder");
            else if (sys.size() != par1.size() || sys.size() != par2.size())
                add_message($sformatf(
                    "ERROR:binding:The streams differ in length: sys has %0d values, par1 %0d, par2 %0d",
                    sys.size(), par1.size(), par2.size()));
            else
                result = decode_streams(sys, par1, par2, iterations, tag);
            status = result;
            return result;
        endfunction

        // What status means.
        function string status_text();
            case (status)
                0: return "decoded";
                1: return "an argument was refused";
                2: return "the block was refused";
                default: return "out of memory";
            endcase
        endfunction

        // Releases the decoder. Another call does nothing.
        function void destroy();
            morvik_dpi_destroy(handle);
            handle = null;
            destroyed = 1;
        endfunction

        local function int decode_streams(
            input soft_values_t sys,
            input soft_values_t par1,
            input soft_values_t par2,
            input int iterations,
            input int unsigned tag
        );
            int result;
            for (int i = 0; i < sys.size(); i++)
                morvik_dpi_put(handle, sys[i], par1[i], par2[i]);
            result = morvik_dpi_decode(handle, iterations, tag);
            collect_messages();
            if (result == 0) begin
                dout = new[morvik_dpi_size(handle)];
                for (int i = 0; i < dout.size(); i++)
                    dout[i] = morvik_dpi_bit(handle, i) != 0;
                dout_tag = morvik_dpi_tag(handle);
            end
            return result;
        endfunction

        local function void collect_messages();
            string line;
            line = morvik_dpi_message(handle);
            while (line != "") begin
                add_message(line);
                line = morvik_dpi_message(handle);
            end
        endfunction

        local function void add_message(string line);
            if (morvik_log == null)
                morvik_log = new;
            message = message == "" ? line : {message, "\n", line};
            if (line.len() >= 8 && line.substr(0, 7) == "WARNING:")
                morvik_log.report_warning(line);
            else
                morvik_log.report_error(line);
        endfunction
    endclass

endpackage

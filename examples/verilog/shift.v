// An 8-stage shift register built from a stage module, so that the netlist keeps its hierarchy
// until it is flattened.
module stage (input clk, input d, output reg q);
    always @(posedge clk) q <= d;
endmodule

module shift (input clk, input din, output dout, output [1:0] tap);
    wire [8:0] s;
    assign s[0] = din;
    genvar i;
    generate for (i = 0; i < 8; i = i + 1) begin : g
        stage st (.clk(clk), .d(s[i]), .q(s[i + 1]));
    end endgenerate
    assign dout = s[8];
    assign tap = {s[6], s[3]};
endmodule
